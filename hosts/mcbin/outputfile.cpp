#include "outputfile.h"

#include "failure.h"
#include "interrupt.h"

#include <cerrno>
#include <cstring>
#include <filesystem>

#include <stdlib.h>
#include <sys/stat.h>
#include <unistd.h>

namespace
{

/// mkstemp makes files for their owner alone; the ones that are kept get what any new file gets.
void GiveUsualMode(int descriptor)
{
    const mode_t mask = umask(0);
    umask(mask);
    fchmod(descriptor, 0666 & ~mask);
}

} // namespace

void OutputFile::Closer::operator()(std::FILE* file) const
{
    if (file != stdout)
        std::fclose(file);
}

OutputFile::OutputFile(const std::string& path) : fPath(path)
{
    std::error_code error;
    const std::filesystem::file_status status = std::filesystem::status(path, error);
    if (path == "-")
    {
        fPath = "standard output";
        fFile.reset(stdout);
    }
    else if (std::filesystem::exists(status) && !std::filesystem::is_regular_file(status))
        fFile.reset(std::fopen(path.c_str(), "wb"));
    else
        OpenTemporary();
    if (!fFile)
        Fail();
}

OutputFile::~OutputFile()
{
    if (!fTemporary.empty())
        unlink(fTemporary.c_str());
}

void OutputFile::OpenTemporary()
{
    // A link stays one: what it leads to is replaced.
    std::error_code error;
    const std::filesystem::path target = std::filesystem::canonical(fPath, error);
    if (!error)
        fPath = target.string();
    std::string name = fPath + ".XXXXXX";
    const int descriptor = mkstemp(name.data());
    if (descriptor < 0)
        Fail();
    fTemporary = name;
    GiveUsualMode(descriptor);
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
    if (fFile.get() != stdout && std::fclose(fFile.release()) != 0)
        Fail();
    if (!fTemporary.empty() && std::rename(fTemporary.c_str(), fPath.c_str()) != 0)
        Fail();
    fTemporary.clear();
}

void OutputFile::Fail() const
{
    if (errno == EPIPE)
        throw PipeClosed();
    if (errno == EINTR)
        ThrowIfInterrupted();
    throw Failure("cannot write " + fPath + ": " + std::strerror(errno));
}
