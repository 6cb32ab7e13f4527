#include "inputfile.h"

#include "failure.h"
#include "interrupt.h"

#include <array>
#include <cerrno>
#include <cstring>
#include <filesystem>
#include <utility>

#include <stdlib.h>
#include <unistd.h>

namespace
{

Failure MakeFailure(const std::string& name)
{
    return Failure(name + ": " + std::strerror(errno));
}

std::FILE* Open(const std::string& path)
{
    // Asked first, as to open a pipe would wait for its other end.
    std::error_code error;
    const std::filesystem::file_status status = std::filesystem::status(path, error);
    if (std::filesystem::exists(status) && !std::filesystem::is_regular_file(status))
        throw Failure(path + ": not a regular file; it has to be one, as it is read twice. Use - for standard input");
    std::FILE* const file = std::fopen(path.c_str(), "rb");
    if (!file)
        throw MakeFailure(path);
    return file;
}

std::FILE* OpenNameless(const std::string& directory)
{
    std::error_code error;
    std::string folder = directory.empty() ? std::filesystem::temp_directory_path(error).string() : directory;
    if (error)
        folder = "/tmp";
    std::string path = folder + "/mcbin-XXXXXX";
    const int descriptor = mkstemp(path.data());
    if (descriptor < 0)
        throw MakeFailure("cannot make a temporary file in " + folder);
    unlink(path.c_str());
    std::FILE* const file = fdopen(descriptor, "w+b");
    if (!file)
        close(descriptor);
    return file ? file : throw MakeFailure(path);
}

} // namespace

InputFile::InputFile(const std::string& path) : InputFile(path, Open(path)) {}

InputFile::InputFile(std::string name, std::FILE* file) : fName(std::move(name)), fFile(file) {}

InputFile InputFile::SpoolStandardInput(const std::string& directory)
{
    InputFile spool("standard input", OpenNameless(directory));
    std::array<char, 1 << 16> block;
    for (;;)
    {
        ThrowIfInterrupted();
        const ssize_t size = read(STDIN_FILENO, block.data(), block.size());
        if (size < 0 && errno == EINTR)
            continue;
        if (size < 0)
            throw MakeFailure(spool.fName);
        const auto wanted = static_cast<std::size_t>(size);
        if (std::fwrite(block.data(), 1, wanted, spool.fFile.get()) != wanted ||
            (size == 0 && std::fflush(spool.fFile.get()) != 0))
            throw MakeFailure("cannot write the temporary copy of standard input");
        if (size == 0)
            return spool;
    }
}

std::size_t InputFile::Read(char* buffer, std::size_t size)
{
    const std::size_t read = std::fread(buffer, 1, size, fFile.get());
    if (std::ferror(fFile.get()))
        throw MakeFailure(fName);
    return read;
}

void InputFile::Rewind()
{
    std::rewind(fFile.get());
}
