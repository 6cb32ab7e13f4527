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
    : fBlock(kBlockSize), fFileName(path), fPlatform(platform)
{
    fFile = fPlatform->OpenForReading(fFileName, identity);
    if (!HasFile())
    {
        std::cout << "Error: file handle is NULL in BinaryRecordIterator constructor";
        fRecordStatus = kFailed;
        return;
    }
    fRecordStatus = ReadBlock();
}

BinaryRecordIterator::~BinaryRecordIterator()
{
    if (HasFile())
        fPlatform->CloseFile(fFile); // nothing was written, so nothing can be lost
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
    fRecordStatus = fPlatform->RewindFile(fFile) ? ReadBlock() : kFailed;
    return fRecordStatus;
}

/// A file that ends within a block is at its end when the values before that are taken: a failed read of the rest says
/// so.
int BinaryRecordIterator::ReadBlock()
{
    fNextValue = 0;
    fBlockSize = fPlatform->ReadDoubles(fBlock.data(), fBlock.size(), fFile);
    if (fBlockSize > 0)
        return kMoreToCome;
    return std::feof(fFile) != 0 ? kEndOfFile : kFailed;
}

} // namespace MCBinning
