#ifndef MCOBNQRT_RECORDFILES_H
#define MCOBNQRT_RECORDFILES_H

#include "data/binrecordbuffer.h"
#include "platform/platform.h"

#include <mcobnqrt/mcstatus.h>

#include <cstddef>
#include <cstdint>
#include <cstdio>
#include <string>
#include <vector>

class BINCancelMonitor;

/// What is known of a temporary file beside its name.
struct SpoolFile
{
    bool fIsMade = false; ///< we made it; before that, whatever bears the name is somebody else's
    FileIdentity fIdentity;
    std::uint64_t fNumValues = 0; ///< elements written
};

/// The temporary files of a pass, one for each position of a processed record, and the buffer in front of them.
///
/// Names are picked before the pass. A file becomes ours when it is made, which fails if anything bears the name by
/// then: until then nothing is read, written or removed under that name, and afterwards only that very file is.
class RecordFiles
{
public:
    /// Monitor and platform outlive the object.
    RecordFiles(const std::string& directory, BINCancelMonitor* cancelMonitor, Platform* platform);
    RecordFiles(const RecordFiles&) = delete;
    RecordFiles& operator=(const RecordFiles&) = delete;
    /// Removes the files. Whoever reads them has closed them by then.
    ~RecordFiles();

    /// Sizes the buffer and picks a free name for each position's file. No file comes into being here, and files of an
    /// earlier call are removed.
    ///
    /// \return OK, BINStatusOutOfMemory, BINStatusTempDirNotFound, BINStatusCannotOpenTempFile or BINStatusCancelled.
    MCBinning::MCStatus Init(int numPositions);

    void Append(int position, double value) { fBuffer.Append(position, value); }

    /// Whether some position has no room left, so that Flush() is due.
    bool IsFull() const { return fBuffer.IsFull(); }

    /// Writes the rows of the buffer behind what their files hold, makes the files where this is the first time, and
    /// empties the buffer, whatever the result. Every position gets a file, also one without a value.
    ///
    /// \return OK, or BINStatusCannotOpenTempFile.
    MCBinning::MCStatus Flush();

    const std::vector<std::string>& GetNames() const { return fNames; }         ///< by position
    const std::vector<SpoolFile>& GetSpoolFiles() const { return fSpoolFiles; } ///< by position

private:
    bool InitBuffer(int numPositions);
    MCBinning::MCStatus PickName(std::size_t position);
    NameState ProbeNextName(std::string& candidate);
    bool FlushRow(std::size_t position);
    std::FILE* Make(std::size_t position);
    void RemoveAll();

    std::string fPathPrefix; ///< the directory with its separator
    BINCancelMonitor* fCancelMonitor;
    Platform* fPlatform;
    BINRecordBuffer fBuffer;
    int fBufferSize = 10000;    ///< values held per position before a flush
    std::int64_t fNextTick = 0; ///< number of the next candidate name
    std::vector<std::string> fNames;
    std::vector<SpoolFile> fSpoolFiles;
};

#endif
