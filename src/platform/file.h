#ifndef MCOBNQRT_FILE_H
#define MCOBNQRT_FILE_H

#include "platform/platform.h"

#include <cstddef>
#include <cstdio>

/// Owns a stream that a platform has opened, and closes it through the platform, which outlives the object.
class File
{
public:
    /// Takes over `stream`; null gives an object without a file, which can only be asked IsOpen().
    File(std::FILE* stream, Platform* platform) : fStream(stream), fPlatform(platform) {}
    File(const File&) = delete;
    File& operator=(const File&) = delete;
    ~File()
    {
        if (IsOpen())
            Close(); // a writer has called Close() by then, for its result
    }

    bool IsOpen() const { return fStream != nullptr; }
    bool IsAtEnd() const { return std::feof(fStream) != 0; }

    /// As the operations of Platform.
    std::size_t ReadDoubles(double* values, std::size_t count)
    {
        return fPlatform->ReadDoubles(values, count, fStream);
    }
    std::size_t WriteDoubles(const double* values, std::size_t count)
    {
        return fPlatform->WriteDoubles(values, count, fStream);
    }
    bool Rewind() { return fPlatform->RewindFile(fStream); }

    bool Close()
    {
        std::FILE* const stream = fStream;
        fStream = nullptr;
        return fPlatform->CloseFile(stream);
    }

private:
    std::FILE* fStream;
    Platform* fPlatform;
};

#endif
