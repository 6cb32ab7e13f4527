#include "data/recordfiles.h"

#include "base/bincancelmonitor.h"
#include "base/makestatus.h"
#include "platform/file.h"

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

RecordFiles::RecordFiles(const std::string& directory, BINCancelMonitor* cancelMonitor, Platform* platform)
    : fPathPrefix(AsPathPrefix(directory)), fCancelMonitor(cancelMonitor), fPlatform(platform)
{
}

RecordFiles::~RecordFiles()
{
    RemoveAll();
}

MCStatus RecordFiles::Init(int numPositions)
{
    if (!InitBuffer(numPositions))
        return MakeError(MCBinning::BINStatusOutOfMemory);
    RemoveAll();
    fNames.assign(static_cast<std::size_t>(numPositions), std::string());
    fSpoolFiles.assign(fNames.size(), SpoolFile());
    fNextTick = fPlatform->GetTickCount();

    MCStatus status;
    for (std::size_t position = 0; position < fNames.size() && status.IsOK(); ++position)
    {
        status = PickName(position);
    }
    return status;
}

bool RecordFiles::InitBuffer(int numPositions)
{
    if (fBuffer.Init(numPositions, fBufferSize))
        return true;
    fBufferSize /= 2;
    return fBuffer.Init(numPositions, fBufferSize);
}

/// Gives the position the next free name. A cancel doesn't stop the search, but no name is taken after it.
MCStatus RecordFiles::PickName(std::size_t position)
{
    MCStatus status;
    for (;;)
    {
        std::string candidate;
        switch (ProbeNextName(candidate))
        {
        case NameState::kFree:
            if (status.IsOK())
                fNames[position] = candidate;
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

NameState RecordFiles::ProbeNextName(std::string& candidate)
{
    candidate = fPathPrefix + Hexadecimal(fNextTick);
    ++fNextTick;
    return fPlatform->ProbeName(candidate);
}

MCStatus RecordFiles::Flush()
{
    bool isWritten = true;
    for (std::size_t position = 0; position < fNames.size() && isWritten; ++position) isWritten = FlushRow(position);
    fBuffer.Reset();
    return isWritten ? MCStatus() : MakeError(MCBinning::BINStatusCannotOpenTempFile);
}

/// A full disk shows when large rows are written, and for small ones not before the file is closed.
bool RecordFiles::FlushRow(std::size_t position)
{
    SpoolFile& spool = fSpoolFiles[position];
    File file(spool.fIsMade
                  ? fPlatform->OpenForAppending(fNames[position], spool.fIdentity, spool.fNumValues * sizeof(double))
                  : Make(position),
              fPlatform);
    if (!file.IsOpen())
        return false;
    const int row = static_cast<int>(position);
    const auto count = static_cast<std::size_t>(fBuffer.RowFill(row));
    const bool isWritten = file.WriteDoubles(fBuffer.RowData(row), count) == count;
    const bool isClosed = file.Close();
    spool.fNumValues += count;
    return isWritten && isClosed;
}

/// Makes the position's file, under the next free name where somebody else has taken the picked one in the meantime.
std::FILE* RecordFiles::Make(std::size_t position)
{
    SpoolFile& spool = fSpoolFiles[position];
    std::FILE* file = nullptr;
    NameState state = fPlatform->CreateNewFile(fNames[position], file, spool.fIdentity);
    while (state == NameState::kTaken)
    {
        state = ProbeNextName(fNames[position]);
        if (state == NameState::kFree)
            state = fPlatform->CreateNewFile(fNames[position], file, spool.fIdentity);
    }
    spool.fIsMade = file != nullptr;
    return file;
}

void RecordFiles::RemoveAll()
{
    for (std::size_t position = 0; position < fSpoolFiles.size(); ++position)
    {
        if (fSpoolFiles[position].fIsMade)
            fPlatform->RemoveFile(fNames[position], fSpoolFiles[position].fIdentity);
    }
    fNames.clear();
    fSpoolFiles.clear();
}
