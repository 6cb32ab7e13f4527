#include "hosts/mcbin/output/outputfile.h"

#include "hosts/mcbin/failure.h"
#include "hosts/mcbin/interrupt.h"

#include <cerrno>
#include <cstring>
#include <filesystem>
#include <optional>
#include <system_error>

#include <fcntl.h>
#include <stdlib.h>
#include <sys/stat.h>
#include <unistd.h>

namespace
{

namespace fs = std::filesystem;

/// Whether the path is a name of one of this process's own descriptors, which is a link for the system.
bool IsDescriptor(const fs::path& path)
{
    std::error_code error;
    const fs::path descriptors = fs::canonical("/proc/self/fd", error);
    return !error && fs::is_symlink(fs::symlink_status(path, error)) &&
           fs::canonical(fs::absolute(path).parent_path(), error) == descriptors;
}

/// What a chain of links leads to, as a shell's > has it: a file that is there or not, or a descriptor, as behind
/// /dev/stdout. Sets errno and gives nothing if the chain doesn't end.
std::optional<fs::path> FollowLinks(fs::path path)
{
    constexpr int kMostLinks = 40; // as many as the system follows
    std::error_code error;
    for (int i = 0; i < kMostLinks; ++i)
    {
        if (!fs::is_symlink(fs::symlink_status(path, error)) || IsDescriptor(path))
            return path;
        path = path.parent_path() / fs::read_symlink(path, error); // an absolute one replaces the directory
    }
    errno = ELOOP;
    return std::nullopt;
}

bool IsOtherThanAFile(const fs::path& path)
{
    std::error_code error;
    const fs::file_status status = fs::status(path, error);
    return fs::exists(status) && !fs::is_regular_file(status);
}

/// mkstemp makes files for their owner alone. One that is kept gets what the umask leaves, as any new file, or takes
/// over from the file that it replaces.
void GiveMode(int descriptor, const std::string& replaced)
{
    struct stat former = {};
    if (stat(replaced.c_str(), &former) != 0)
    {
        const mode_t mask = umask(0);
        umask(mask);
        fchmod(descriptor, 0666 & ~mask);
        return;
    }
    // Only root can give a file away, and others only to groups of their own.
    const bool isSameGroup = fchown(descriptor, former.st_uid, former.st_gid) == 0 ||
                             fchown(descriptor, static_cast<uid_t>(-1), former.st_gid) == 0;
    // What the former group could do is not for another one.
    fchmod(descriptor, former.st_mode & (isSameGroup ? 0777 : 0707));
}

/// Flushes the directory, so that the new name outlasts a loss of power. The name is given by now, so a system that
/// can't flush a directory, or that lets it be written but not read, is no failure.
void FlushDirectory(const std::string& path)
{
    const fs::path directory = fs::path(path).parent_path();
    const int descriptor = open(directory.empty() ? "." : directory.c_str(), O_RDONLY | O_DIRECTORY | O_CLOEXEC);
    if (descriptor < 0)
        return;
    fsync(descriptor);
    close(descriptor);
}

} // namespace

void OutputFile::Closer::operator()(std::FILE* file) const
{
    if (file != stdout)
        std::fclose(file);
}

OutputFile::OutputFile(const std::string& path) : fPath(path)
{
    if (path == "-")
    {
        fPath = "standard output";
        fFile.reset(stdout);
        return;
    }
    const std::optional<fs::path> target = FollowLinks(path);
    if (target && IsDescriptor(*target))
    {
        // To open it once more would begin at the front of a file that a shell has opened.
        fFile.reset(fdopen(dup(std::stoi(target->filename().string())), "wb"));
    }
    else if (target && IsOtherThanAFile(*target))
        fFile.reset(std::fopen(path.c_str(), "wb"));
    else if (target)
        OpenTemporary(target->string());
    if (!fFile)
        Fail();
}

OutputFile::~OutputFile()
{
    if (!fTemporary.empty())
        unlink(fTemporary.c_str());
}

void OutputFile::OpenTemporary(const std::string& target)
{
    // A file needn't be writable to be replaced, but its mode says that it isn't to be lost.
    if (access(target.c_str(), W_OK) != 0 && errno != ENOENT)
        Fail();
    fTarget = target;
    std::string name = target + ".XXXXXX";
    const int descriptor = mkstemp(name.data());
    if (descriptor < 0)
        Fail();
    fTemporary = name;
    fFile.reset(fdopen(descriptor, "wb"));
}

void OutputFile::Write(std::string_view text)
{
    if (std::fwrite(text.data(), 1, text.size(), fFile.get()) != text.size())
        Fail();
}

void OutputFile::Commit()
{
    if (std::fflush(fFile.get()) != 0)
        Fail();
    if (!fTemporary.empty())
        Secure(fileno(fFile.get()));
    if (fFile.get() != stdout && std::fclose(fFile.release()) != 0)
        Fail();
    if (fTemporary.empty())
        return;
    ThrowIfInterrupted();
    if (std::rename(fTemporary.c_str(), fTarget.c_str()) != 0)
        Fail();
    fTemporary.clear();
    FlushDirectory(fTarget);
}

/// The contents go to the disk ahead of the name: after a loss of power it must not be that of an empty file.
void OutputFile::Secure(int descriptor) const
{
    GiveMode(descriptor, fTarget);
    if (fsync(descriptor) != 0 && errno != EINVAL) // which a file system says that has nothing to flush
        Fail();
}

void OutputFile::Fail() const
{
    if (errno == EPIPE)
        throw PipeClosed();
    if (errno == EINTR)
        ThrowIfInterrupted();
    throw Failure("cannot write " + fPath + ": " + std::strerror(errno));
}
