#include "hosts/mcbin/input/inputfile.h"

#include "hosts/mcbin/failure.h"
#include "hosts/mcbin/interrupt.h"

#include <mcobnqrt/binsettings.h>

#include <algorithm>
#include <array>
#include <cerrno>
#include <cstring>
#include <utility>

#include <stdlib.h>
#include <sys/stat.h>
#include <unistd.h>

namespace
{

Failure MakeFailure(const std::string& name)
{
    return Failure(name + ": " + std::strerror(errno));
}

/// Standard input by a descriptor of its own, as the owner closes what it gets. Null if the system refuses.
std::FILE* Open(const std::string& path)
{
    return path == "-" ? fdopen(dup(STDIN_FILENO), "rb") : std::fopen(path.c_str(), "rb");
}

std::FILE* OpenNameless(const std::string& directory)
{
    const std::string folder = directory.empty() ? BINSettings().GetTempDirName() : directory;
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

InputFile::InputFile(const std::string& path) : fName(path == "-" ? "standard input" : path), fFile(Open(path))
{
    ThrowIfInterrupted(); // while it waited for the other end of a named pipe
    if (!fFile)
        throw MakeFailure(fName);
}

void InputFile::MakeRewindable(const std::string& directory)
{
    struct stat status = {};
    const bool isRegular = fstat(fileno(fFile.get()), &status) == 0 && S_ISREG(status.st_mode);
    if (isRegular && lseek(fileno(fFile.get()), 0, SEEK_CUR) == 0)
        return;
    std::unique_ptr<std::FILE, Closer> spool(OpenNameless(directory));
    CopyTo(spool.get());
    fFile = std::move(spool);
    Rewind();
}

void InputFile::CopyTo(std::FILE* spool)
{
    std::array<char, 1 << 16> block;
    for (;;)
    {
        ThrowIfInterrupted();
        const std::size_t size = ReadFile(block.data(), block.size());
        if (std::fwrite(block.data(), 1, size, spool) != size || (size < block.size() && std::fflush(spool) != 0))
            throw MakeFailure("cannot write the temporary copy of " + fName);
        if (size < block.size())
            return;
    }
}

std::size_t InputFile::Read(char* buffer, std::size_t size)
{
    if (!fIsLookedAt)
        LookAtBeginning();
    if (fDecompressor)
        return Decompress(buffer, size);
    const std::size_t numTaken = ReadTaken(buffer, size);
    return numTaken + ReadFile(buffer + numTaken, size - numTaken);
}

void InputFile::LookAtBeginning()
{
    fInput.resize(kNumTellingBytes);
    fInput.resize(ReadFile(fInput.data(), fInput.size()));
    fDecompressor = MakeDecompressor({fInput.data(), fInput.size()}, fName);
    fIsLookedAt = true;
}

/// Hands on what was read to look at it.
std::size_t InputFile::ReadTaken(char* buffer, std::size_t size)
{
    const std::size_t number = std::min(size, fInput.size() - fTaken);
    std::copy_n(fInput.data() + fTaken, number, buffer);
    fTaken += number;
    return number;
}

std::size_t InputFile::Decompress(char* buffer, std::size_t size)
{
    constexpr std::size_t kBlock = 1 << 16;
    std::size_t number = 0;
    while (number < size)
    {
        std::string_view input(fInput.data() + fTaken, fInput.size() - fTaken);
        const std::size_t numWritten = fDecompressor->Decompress(input, buffer + number, size - number);
        const bool hasMoved = numWritten > 0 || input.size() < fInput.size() - fTaken;
        fTaken = fInput.size() - input.size();
        number += numWritten;
        if (hasMoved)
            continue;
        fTaken = 0;
        fInput.resize(kBlock);
        fInput.resize(ReadFile(fInput.data(), fInput.size()));
        if (fInput.empty() && !fDecompressor->IsAtEnd())
            throw Failure(fName + ": the compressed data end too early");
        if (fInput.empty())
            break;
    }
    return number;
}

/// Fills `buffer` with the bytes of the file, as they are there.
std::size_t InputFile::ReadFile(char* buffer, std::size_t size)
{
    std::size_t read = 0;
    for (;;)
    {
        read += std::fread(buffer + read, 1, size - read, fFile.get());
        if (!std::ferror(fFile.get()))
        {
            // A Ctrl-C ends the program that writes into a pipe, too, and then what has come isn't all there was.
            if (read < size)
                ThrowIfInterrupted();
            return read;
        }
        if (errno != EINTR)
            throw MakeFailure(fName);
        ThrowIfInterrupted();
        std::clearerr(fFile.get());
    }
}

void InputFile::Rewind()
{
    std::rewind(fFile.get());
    fIsLookedAt = false;
    fDecompressor.reset();
    fInput.clear();
    fTaken = 0;
}
