// The temporary files of the data pass: their names, their coming into being, their growth and their end.
//
// A name is picked before the pass and becomes ours when its file is made, which fails if anything bears the name by
// then. Until a file is made nothing is read, written or removed under its name; from then on only that very file is.

#include "base/bincancelmonitor.h"
#include "base/makestatus.h"
#include "data/bindatapreparator.h"
#include "metadata/recordlayout.h"

#include <array>
#include <charconv>

using MCBinning::MCStatus;

namespace
{

/// Lower-case, without prefix and leading zeros, and untouched by the host's locale.
std::string Hexadecimal(std::int64_t number)
{
    std::array<char, 2 * sizeof(number)> digits{};
    const auto end =
        std::to_chars(digits.data(), digits.data() + digits.size(), static_cast<std::uint64_t>(number), 16);
    return std::string(digits.data(), end.ptr);
}

/// The directory as the beginning of a path. A trailing backslash counts as a separator on every system: it is what
/// some hosts write.
std::string AsPathPrefix(const std::string& directory)
{
    const bool isComplete = directory.empty() || directory.back() == '/' || directory.back() == '\\';
    return isComplete ? directory : directory + "/";
}

} // namespace

MCStatus BINDataPreparator::InitTempFiles()
{
    // Everything behind this point rests on one position for each variable, and so for each field of a host record.
    if (FindVariableWithoutPosition(*fVarList) >= 0)
        return MakeError(MCBinning::BINStatusInvalidVarList);
    if (!InitBuffer())
        return MakeError(MCBinning::BINStatusOutOfMemory);
    RemoveTempFiles();
    fFileNames.assign(fProcRecSize, std::string());
    fSpoolFiles.assign(fProcRecSize, SpoolFile());
    fNextTick = fPlatform->GetTickCount();

    MCStatus status;
    for (std::size_t position = 0; position < fFileNames.size() && status.IsOK(); ++position)
        status = PickFileName(position);
    return status;
}

bool BINDataPreparator::InitBuffer()
{
    const int rows = static_cast<int>(fProcRecSize);
    if (fBuffer.Init(rows, fBufferSize))
        return true;
    fBufferSize /= 2;
    return fBuffer.Init(rows, fBufferSize);
}

/// Gives the position the next free name. A cancel doesn't stop the search, but no name is taken after it.
MCStatus BINDataPreparator::PickFileName(std::size_t position)
{
    MCStatus status;
    for (;;)
    {
        std::string candidate;
        switch (ProbeNextName(candidate))
        {
        case NameState::kFree:
            if (status.IsOK())
                fFileNames[position] = candidate;
            return status;
        case NameState::kTaken:
            if (fCancelMonitor->IsCancelled())
                status = MakeError(MCBinning::BINStatusCancelled);
            break;
        case NameState::kDirectoryMissing:
            return MakeError(MCBinning::BINStatusTempDirNotFound);
        case NameState::kTooManyOpenFiles:
        case NameState::kFailed:
            return MakeError(MCBinning::BINStatusCannotOpenTempFile);
        }
    }
}

NameState BINDataPreparator::ProbeNextName(std::string& candidate)
{
    candidate = AsPathPrefix(fTempDirName) + Hexadecimal(fNextTick);
    ++fNextTick;
    return fPlatform->ProbeName(candidate);
}

MCStatus BINDataPreparator::FlushBuffer()
{
    bool isWritten = true;
    for (std::size_t position = 0; position < fFileNames.size() && isWritten; ++position)
        isWritten = FlushRow(position);
    fBuffer.Reset();
    return isWritten ? MCStatus() : MakeError(MCBinning::BINStatusCannotOpenTempFile);
}

/// A full disk shows when large rows are written, and for small ones not before the file is closed.
bool BINDataPreparator::FlushRow(std::size_t position)
{
    SpoolFile& spool = fSpoolFiles[position];
    std::FILE* file = spool.fIsMade ? fPlatform->OpenForAppending(fFileNames[position], spool.fIdentity,
                                                                  spool.fNumValues * sizeof(double))
                                    : MakeFile(position);
    if (file == nullptr)
        return false;
    const int row = static_cast<int>(position);
    const auto count = static_cast<std::size_t>(fBuffer.RowFill(row));
    const bool isWritten = fPlatform->WriteDoubles(fBuffer.RowData(row), count, file) == count;
    const bool isClosed = fPlatform->CloseFile(file);
    spool.fNumValues += count;
    return isWritten && isClosed;
}

/// Makes the position's file, under the next free name where somebody else has taken the picked one in the meantime.
std::FILE* BINDataPreparator::MakeFile(std::size_t position)
{
    SpoolFile& spool = fSpoolFiles[position];
    std::FILE* file = nullptr;
    NameState state = fPlatform->CreateNewFile(fFileNames[position], file, spool.fIdentity);
    while (state == NameState::kTaken)
    {
        state = ProbeNextName(fFileNames[position]);
        if (state == NameState::kFree)
            state = fPlatform->CreateNewFile(fFileNames[position], file, spool.fIdentity);
    }
    spool.fIsMade = file != nullptr;
    return file;
}

void BINDataPreparator::RemoveTempFiles()
{
    for (std::size_t position = 0; position < fSpoolFiles.size(); ++position)
    {
        if (fSpoolFiles[position].fIsMade)
            fPlatform->RemoveFile(fFileNames[position], fSpoolFiles[position].fIdentity);
    }
    fFileNames.clear();
    fSpoolFiles.clear();
}
