#include "data/binaryrecorditerator.h"

#include <iostream>

namespace MCBinning
{

namespace
{

/// 64 KiB: a read of them costs a tenth of what single ones do, and larger blocks gain nothing.
constexpr std::size_t kBlockSize = 8192;

} // namespace

BinaryRecordIterator::BinaryRecordIterator(const std::string& path, Platform* platform, const FileIdentity* identity)
    : fBlock(kBlockSize), fFile(platform->OpenForReading(path, identity), platform)
{
    if (!HasFile())
    {
        // This is all that the library prints on its own. The text and its missing line end are promised to hosts.
        std::cout << "Error: file handle is NULL in BinaryRecordIterator constructor";
        fRecordStatus = kFailed;
        return;
    }
    fRecordStatus = ReadBlock();
}

bool BinaryRecordIterator::IsOK() const
{
    return fRecordStatus == kMoreToCome;
}

double BinaryRecordIterator::Next()
{
    if (!IsOK())
        return 0.0;
    const double value = *GetBlock();
    Skip(1);
    return value;
}

void BinaryRecordIterator::Skip(std::size_t count)
{
    fNextValue += count;
    if (fNextValue == fBlockSize)
        fRecordStatus = ReadBlock();
}

int BinaryRecordIterator::GetStatus() const
{
    return fRecordStatus;
}

int BinaryRecordIterator::Rewind()
{
    if (!HasFile())
        return fRecordStatus;
    fRecordStatus = fFile.Rewind() ? ReadBlock() : kFailed;
    return fRecordStatus;
}

/// A file that ends within a block is at its end when the values before that are taken: a failed read of the rest says
/// so.
int BinaryRecordIterator::ReadBlock()
{
    fNextValue = 0;
    fBlockSize = fFile.ReadDoubles(fBlock.data(), fBlock.size());
    if (fBlockSize > 0)
        return kMoreToCome;
    return fFile.IsAtEnd() ? kEndOfFile : kFailed;
}

} // namespace MCBinning
