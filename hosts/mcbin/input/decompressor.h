#ifndef MCBIN_DECOMPRESSOR_H
#define MCBIN_DECOMPRESSOR_H

#include <cstddef>
#include <memory>
#include <string>
#include <string_view>

/// Takes the bytes of a compressed file, and gives those that it stands for. Several compressed files behind one another
/// are one.
class Decompressor
{
public:
    virtual ~Decompressor() = default;

    /// Takes bytes from the beginning of `input`, which it shortens, and writes up to `size` bytes. It may do the one
    /// without the other. \return how many it has written. \throw Failure if the data are damaged.
    virtual std::size_t Decompress(std::string_view& input, char* output, std::size_t size) = 0;

    /// Whether a compressed file ends with what has been taken.
    virtual bool IsAtEnd() const = 0;
};

/// As many bytes as tell in which form a file is.
inline constexpr std::size_t kNumTellingBytes = 8;

/// For a file with gzip or zstd in its first bytes. Null if these are those of a text.
/// \param name of the file, for messages.
/// \throw Failure if they are those of another form, with the command that makes it readable.
std::unique_ptr<Decompressor> MakeDecompressor(std::string_view firstBytes, const std::string& name);

#endif
