#ifndef MCOBNQRT_PLATFORM_H
#define MCOBNQRT_PLATFORM_H

#include <cstddef>
#include <cstdint>
#include <cstdio>
#include <string>

/// Outcome of probing for, or creating, a file.
enum class NameState
{
    kFree,             ///< nothing bears the name; after a creation: the file is made
    kTaken,            ///< something bears the name, readable or not: a file, a directory, a link, a pipe
    kDirectoryMissing, ///< no file can be made there: no directory, not one that we may use, or too long a path
    kTooManyOpenFiles, ///< the process or the system has no file handle left
    kFailed            ///< of a creation only: any other failure
};

/// Identifies a file while it exists, so that a file that somebody puts under a name of ours isn't taken for ours.
struct FileIdentity
{
    std::uint64_t fDevice = 0;
    std::uint64_t fNode = 0;
    std::int64_t fBirth = 0; ///< when it was made, since systems give the number of a removed file again; 0 if unknown
    std::int64_t fMaker = 0; ///< the process that made it; doesn't tell it from other files
};

/// All that the library needs of its system: a clock, and the files of the spool. One object serves any number of
/// algorithms. The files are streams of the C library; whoever opens one closes it through CloseFile.
///
/// Tests derive from it to make single calls fail.
class Platform
{
public:
    virtual ~Platform() = default;

    /// Milliseconds of a steady clock, from an unspecified start.
    virtual std::int64_t GetTickCount() = 0;

    /// `start` is an earlier GetTickCount().
    double GetSecondsSince(std::int64_t start) { return static_cast<double>(GetTickCount() - start) / 1000.0; }

    /// Tells whether a file could be made as `path`. Makes nothing, and doesn't wait on what it finds.
    virtual NameState ProbeName(const std::string& path) = 0;

    /// Makes the file `path`, readable and writable by the user alone, and opens it for writing. Fails if anything
    /// bears the name, a dangling link too. On kFree `file` and `identity` are set; else they are untouched and nothing
    /// is left.
    virtual NameState CreateNewFile(const std::string& path, std::FILE*& file, FileIdentity& identity) = 0;

    /// Opens the file for writing at its end. Null if `path` can't be opened, or is not that regular file, or doesn't
    /// hold exactly `size` bytes. Never makes a file and never follows a link.
    virtual std::FILE* OpenForAppending(const std::string& path, const FileIdentity& identity, std::uint64_t size) = 0;

    /// Opens a file for reading from its start. Null if it can't be opened. Unless `identity` is null, also null if
    /// `path` is a link or not that regular file.
    virtual std::FILE* OpenForReading(const std::string& path, const FileIdentity* identity) = 0;

    /// As std::fread and std::fwrite of doubles: the number of elements read or written.
    virtual std::size_t ReadDoubles(double* values, std::size_t count, std::FILE* file) = 0;
    virtual std::size_t WriteDoubles(const double* values, std::size_t count, std::FILE* file) = 0;

    /// Goes back to the start of the file and clears its end mark. False if that failed.
    virtual bool RewindFile(std::FILE* file) = 0;

    /// Closes the stream, which is gone afterwards in any case. False if something written didn't reach the file.
    virtual bool CloseFile(std::FILE* file) = 0;

    /// Removes the file, if `path` still is that file and this process made it. A failure reaches nobody: there is
    /// nothing left to do about it.
    virtual void RemoveFile(const std::string& path, const FileIdentity& identity) = 0;
};

/// The platform that the program runs on; lives as long as the program.
Platform* SystemPlatform();

/// The directory where the user's programs put their temporary files, without trailing separator: TMPDIR of the
/// environment if it is a directory that files can be made in, else /tmp if that is one, else "./".
std::string SystemTempDirectory();

#endif
