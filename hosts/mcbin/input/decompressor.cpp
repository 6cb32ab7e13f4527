#include "hosts/mcbin/input/decompressor.h"

#include "hosts/mcbin/failure.h"

#include <zlib.h>
#include <zstd.h>

#include <algorithm>
#include <climits>
#include <new>

namespace
{

Failure MakeDamaged(const std::string& name, const std::string& form, const char* why)
{
    return Failure(name + ": the " + form + " data are damaged" + (why ? ": " + std::string(why) : ""));
}

class GzipDecompressor : public Decompressor
{
public:
    explicit GzipDecompressor(const std::string& name) : fName(name)
    {
        constexpr int kGzip = 15 + 16; // the largest window, and the header of gzip
        if (inflateInit2(&fStream, kGzip) != Z_OK)
            throw std::bad_alloc();
    }
    GzipDecompressor(const GzipDecompressor&) = delete;
    GzipDecompressor& operator=(const GzipDecompressor&) = delete;
    ~GzipDecompressor() override { inflateEnd(&fStream); }

    std::size_t Decompress(std::string_view& input, char* output, std::size_t size) override
    {
        if (fIsAtEnd)
            BeginNext(input);
        if (input.empty())
            return 0;
        const auto numIn = static_cast<unsigned int>(std::min<std::size_t>(input.size(), UINT_MAX));
        const auto numOut = static_cast<unsigned int>(std::min<std::size_t>(size, UINT_MAX));
        // zlib does not write to what it reads, though it does not say so.
        fStream.next_in = reinterpret_cast<unsigned char*>(const_cast<char*>(input.data()));
        fStream.avail_in = numIn;
        fStream.next_out = reinterpret_cast<unsigned char*>(output);
        fStream.avail_out = numOut;
        const int result = inflate(&fStream, Z_NO_FLUSH);
        if (result == Z_MEM_ERROR)
            throw std::bad_alloc();
        if (result != Z_OK && result != Z_STREAM_END && result != Z_BUF_ERROR)
            throw MakeDamaged(fName, "gzip", fStream.msg);
        fIsAtEnd = result == Z_STREAM_END;
        input.remove_prefix(numIn - fStream.avail_in);
        return numOut - fStream.avail_out;
    }

    bool IsAtEnd() const override { return fIsAtEnd; }

private:
    /// Programs that write to tapes and disks fill up the last block with zeros.
    void BeginNext(std::string_view& input)
    {
        input.remove_prefix(std::min(input.find_first_not_of('\0'), input.size()));
        if (input.empty())
            return;
        inflateReset(&fStream);
        fIsAtEnd = false;
    }

    std::string fName;
    z_stream fStream = {};
    bool fIsAtEnd = false;
};

class ZstdDecompressor : public Decompressor
{
public:
    explicit ZstdDecompressor(const std::string& name) : fName(name), fStream(ZSTD_createDStream())
    {
        if (!fStream)
            throw std::bad_alloc();
    }

    std::size_t Decompress(std::string_view& input, char* output, std::size_t size) override
    {
        if (fIsAtEnd && input.empty())
            return 0; // to be called would begin another file
        ZSTD_inBuffer in = {input.data(), input.size(), 0};
        ZSTD_outBuffer out = {output, size, 0};
        const std::size_t hint = ZSTD_decompressStream(fStream.get(), &out, &in);
        if (ZSTD_isError(hint))
            throw MakeDamaged(fName, "zstd", ZSTD_getErrorName(hint));
        fIsAtEnd = hint == 0;
        input.remove_prefix(in.pos);
        return out.pos;
    }

    bool IsAtEnd() const override { return fIsAtEnd; }

private:
    struct Deleter
    {
        void operator()(ZSTD_DStream* stream) const { ZSTD_freeDStream(stream); }
    };

    std::string fName;
    std::unique_ptr<ZSTD_DStream, Deleter> fStream;
    bool fIsAtEnd = false;
};

bool BeginsWith(std::string_view text, std::string_view beginning)
{
    return text.substr(0, beginning.size()) == beginning;
}

/// Names what is no text, and the command that makes one of it.
void ThrowIfUnreadable(std::string_view firstBytes, const std::string& name)
{
    struct Form
    {
        std::string_view beginning;
        const char* form;
        const char* command;
    };
    static constexpr Form kForms[] = {
        {{"\xFD\x37\x7A\x58\x5A\x00", 6}, "xz", "xz -dc FILE | mcbin ... -"},
        {{"PK\x03\x04", 4}, "zip", "unzip -p FILE | mcbin ... -"},
        {{"PK\x05\x06", 4}, "an empty zip", "unzip -p FILE | mcbin ... -"},
        {{"PAR1\x15", 5}, "Parquet", "duckdb -csv -c \"FROM 'FILE'\" | mcbin ... -"},
    };
    for (const Form& form : kForms)
    {
        if (BeginsWith(firstBytes, form.beginning))
            throw Failure(name + ": this is " + form.form + ", and no text; read it with: " + form.command);
    }
    const bool isBzip2 = firstBytes.size() >= 6 && BeginsWith(firstBytes, "BZh") && firstBytes.substr(4, 2) == "1A";
    if (isBzip2)
        throw Failure(name + ": this is bzip2, and no text; read it with: bzip2 -dc FILE | mcbin ... -");
}

} // namespace

std::unique_ptr<Decompressor> MakeDecompressor(std::string_view firstBytes, const std::string& name)
{
    if (BeginsWith(firstBytes, "\x1F\x8B"))
        return std::make_unique<GzipDecompressor>(name);
    if (BeginsWith(firstBytes, "\x28\xB5\x2F\xFD"))
        return std::make_unique<ZstdDecompressor>(name);
    ThrowIfUnreadable(firstBytes, name);
    return nullptr;
}
