#include "data/binaryrecorditerator.h"

#include <iostream>

namespace MCBinning
{

BinaryRecordIterator::BinaryRecordIterator(const std::string& path, Platform* platform, const FileIdentity* identity)
    : fFileName(path), fPlatform(platform)
{
    fFile = fPlatform->OpenForReading(fFileName, identity);
    if (!HasFile())
    {
        std::cout << "Error: file handle is NULL in BinaryRecordIterator constructor";
        fRecordStatus = kFailed;
        return;
    }
    fRecordStatus = ReadNext();
}

BinaryRecordIterator::~BinaryRecordIterator()
{
    if (HasFile())
        fPlatform->CloseFile(fFile); // nothing was written, so nothing can be lost
}

bool BinaryRecordIterator::IsOK()
{
    return fRecordStatus == kMoreToCome;
}

double BinaryRecordIterator::Next()
{
    if (!IsOK())
        return 0.0;
    fRecordStatus = ReadNext();
    return fCurrent;
}

int BinaryRecordIterator::GetStatus()
{
    return fRecordStatus;
}

int BinaryRecordIterator::Rewind()
{
    if (!HasFile())
        return fRecordStatus;
    fRecordStatus = fPlatform->RewindFile(fFile) ? kMoreToCome : kFailed;
    fRecordStatus = ReadNext();
    return fRecordStatus;
}

int BinaryRecordIterator::ReadNext()
{
    fCurrent = fLookahead;
    if (!IsOK())
        return fRecordStatus;
    const auto wanted = static_cast<std::size_t>(fFieldsPerRecord);
    const std::size_t read = fPlatform->ReadDoubles(&fLookahead, wanted, fFile);
    if (read == 0 && std::feof(fFile) != 0)
        return kEndOfFile;
    return read < wanted ? kFailed : kMoreToCome;
}

} // namespace MCBinning
