#include "platform/platform.h"

#include <cerrno>
#include <chrono>
#include <cstdlib>

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

namespace
{

/// A descriptor that is closed on every way out, unless a stream has taken it over.
class Descriptor
{
public:
    explicit Descriptor(int number) : fNumber(number) {}
    Descriptor(const Descriptor&) = delete;
    Descriptor& operator=(const Descriptor&) = delete;
    ~Descriptor()
    {
        if (IsOpen())
            close(fNumber);
    }

    bool IsOpen() const { return fNumber >= 0; }
    int Get() const { return fNumber; }

    /// The stream over the descriptor, or null, and then the descriptor is still ours.
    std::FILE* IntoStream(const char* mode)
    {
        std::FILE* stream = fdopen(fNumber, mode);
        if (stream != nullptr)
            fNumber = -1;
        return stream;
    }

private:
    int fNumber;
};

std::string DirectoryOf(const std::string& path)
{
    const std::size_t separator = path.rfind('/');
    if (separator == std::string::npos)
        return ".";
    return separator == 0 ? "/" : path.substr(0, separator);
}

bool HoldsNul(const std::string& path)
{
    return path.find('\0') != std::string::npos;
}

bool IsTakenName(const std::string& path)
{
    struct stat found = {};
    return lstat(path.c_str(), &found) == 0;
}

/// Whether we could make a file in the directory, as the user whose rights count for opening.
bool IsDirectoryUsable(const std::string& directory)
{
    struct stat found = {};
    return stat(directory.c_str(), &found) == 0 && S_ISDIR(found.st_mode) &&
           faccessat(AT_FDCWD, directory.c_str(), W_OK | X_OK, AT_EACCESS) == 0;
}

/// The time at which a file was made, in nanoseconds, 0 if the system doesn't tell. It is the file at `path`, seen from
/// `directory`, or with an empty path the one that is open as `directory` itself.
std::int64_t TimeOfBirth(int directory, const char* path)
{
#ifdef STATX_BTIME
    struct statx found = {};
    if (statx(directory, path, AT_EMPTY_PATH | AT_SYMLINK_NOFOLLOW, STATX_BTIME, &found) == 0 &&
        (found.stx_mask & STATX_BTIME) != 0)
        return found.stx_btime.tv_sec * std::int64_t{1000000000} + found.stx_btime.tv_nsec;
#endif
    return 0;
}

FileIdentity IdentityOf(const struct stat& found, std::int64_t birth)
{
    return {static_cast<std::uint64_t>(found.st_dev), static_cast<std::uint64_t>(found.st_ino), birth, getpid()};
}

/// A time of birth tells two files apart only where it is known of both: a system may tell it at one time and refuse to
/// at another.
bool IsSameFile(const struct stat& found, std::int64_t birth, const FileIdentity& identity)
{
    const bool isSameBirth = birth == identity.fBirth || birth == 0 || identity.fBirth == 0;
    return S_ISREG(found.st_mode) && static_cast<std::uint64_t>(found.st_dev) == identity.fDevice &&
           static_cast<std::uint64_t>(found.st_ino) == identity.fNode && isSameBirth;
}

/// Sets `found` if the descriptor is open on that file.
bool IsOpenOn(const Descriptor& opened, const FileIdentity& identity, struct stat& found)
{
    return opened.IsOpen() && fstat(opened.Get(), &found) == 0 &&
           IsSameFile(found, TimeOfBirth(opened.Get(), ""), identity);
}

/// What it means that a name couldn't be opened. Only the free name and the missing directory are hard to tell apart:
/// the system gives one error for both, and a link without an end looks like either.
NameState StateOfUnopenedName(const std::string& path, int error)
{
    if (error == EMFILE || error == ENFILE)
        return NameState::kTooManyOpenFiles;
    if (IsTakenName(path))
        return NameState::kTaken;
    if (error == ENAMETOOLONG || error == ENOTDIR || !IsDirectoryUsable(DirectoryOf(path)))
        return NameState::kDirectoryMissing;
    return NameState::kFree;
}

class PosixPlatform : public Platform
{
public:
    std::int64_t GetTickCount() override
    {
        const auto now = std::chrono::steady_clock::now().time_since_epoch();
        return std::chrono::duration_cast<std::chrono::milliseconds>(now).count();
    }

    NameState ProbeName(const std::string& path) override
    {
        if (HoldsNul(path))
            return NameState::kDirectoryMissing;
        // What bears the name is not opened: that would wake a writer who waits for a reader of its pipe.
        if (IsTakenName(path))
            return NameState::kTaken;
        const Descriptor probe(open(path.c_str(), O_RDONLY | O_NONBLOCK | O_NOFOLLOW | O_NOCTTY | O_CLOEXEC));
        return probe.IsOpen() ? NameState::kTaken : StateOfUnopenedName(path, errno);
    }

    NameState CreateNewFile(const std::string& path, std::FILE*& file, FileIdentity& identity) override
    {
        constexpr mode_t kUserOnly = S_IRUSR | S_IWUSR;
        Descriptor created(
            open(path.c_str(), O_WRONLY | O_CREAT | O_EXCL | O_APPEND | O_NOFOLLOW | O_CLOEXEC, kUserOnly));
        if (!created.IsOpen())
            return errno == EEXIST ? NameState::kTaken : NameState::kFailed;

        struct stat made = {};
        std::FILE* stream = fstat(created.Get(), &made) == 0 ? created.IntoStream("ab") : nullptr;
        if (stream == nullptr)
        {
            unlink(path.c_str());
            return NameState::kFailed;
        }
        file = stream;
        identity = IdentityOf(made, TimeOfBirth(fileno(stream), ""));
        return NameState::kFree;
    }

    std::FILE* OpenForAppending(const std::string& path, const FileIdentity& identity, std::uint64_t size) override
    {
        Descriptor opened(open(path.c_str(), O_WRONLY | O_APPEND | O_NONBLOCK | O_NOFOLLOW | O_NOCTTY | O_CLOEXEC));
        struct stat found = {};
        if (!IsOpenOn(opened, identity, found))
            return nullptr;
        return static_cast<std::uint64_t>(found.st_size) == size ? opened.IntoStream("ab") : nullptr;
    }

    std::FILE* OpenForReading(const std::string& path, const FileIdentity* identity) override
    {
        if (identity == nullptr)
            return std::fopen(path.c_str(), "rbe");
        Descriptor opened(open(path.c_str(), O_RDONLY | O_NONBLOCK | O_NOFOLLOW | O_NOCTTY | O_CLOEXEC));
        struct stat found = {};
        if (!IsOpenOn(opened, *identity, found))
            return nullptr;
        return opened.IntoStream("rb");
    }

    std::size_t ReadDoubles(double* values, std::size_t count, std::FILE* file) override
    {
        return std::fread(values, sizeof(double), count, file);
    }

    std::size_t WriteDoubles(const double* values, std::size_t count, std::FILE* file) override
    {
        return std::fwrite(values, sizeof(double), count, file);
    }

    bool RewindFile(std::FILE* file) override
    {
        std::clearerr(file);
        return std::fseek(file, 0, SEEK_SET) == 0;
    }

    bool CloseFile(std::FILE* file) override { return std::fclose(file) == 0; }

    void RemoveFile(const std::string& path, const FileIdentity& identity) override
    {
        // A child process that fork() made has a copy of what knows the file, but the file is still its parent's.
        if (identity.fMaker != getpid())
            return;
        struct stat found = {};
        if (lstat(path.c_str(), &found) == 0 && IsSameFile(found, TimeOfBirth(AT_FDCWD, path.c_str()), identity))
            unlink(path.c_str());
    }
};

} // namespace

Platform* SystemPlatform()
{
    static PosixPlatform platform;
    return &platform;
}

std::string SystemTempDirectory()
{
    const char* const fromEnvironment = std::getenv("TMPDIR");
    for (std::string directory : {fromEnvironment != nullptr ? fromEnvironment : "", "/tmp"})
    {
        if (!IsDirectoryUsable(directory))
            continue;
        while (directory.size() > 1 && directory.back() == '/') directory.pop_back();
        return directory;
    }
    return "./";
}
