#include "hosts/python/src/spool.h"

#include <cerrno>
#include <cstddef>
#include <cstdlib>
#include <system_error>
#include <unistd.h>

namespace
{

[[noreturn]] void ThrowSystemError(const std::string& what)
{
    throw std::system_error(errno, std::generic_category(), what);
}

/// mkstemp gives the file the mode 0600 and a name that nobody had.
std::FILE* OpenNameless(const std::string& directory)
{
    std::string name = directory + "/mcbinning-XXXXXX";
    const int descriptor = mkstemp(name.data());
    if (descriptor < 0)
        ThrowSystemError("can't make a temporary file in " + directory);
    unlink(name.c_str());
    std::FILE* const file = fdopen(descriptor, "w+b");
    if (file == nullptr)
    {
        close(descriptor);
        ThrowSystemError("can't open a temporary file in " + directory);
    }
    return file;
}

} // namespace

Spool::Spool(BlockSource& source, const std::vector<Field>& fields, const std::string& directory)
    : fAreKept(fields.size(), true), fFile(OpenNameless(directory))
{
    Block block(fields.size());
    while (source.Next(block))
    {
        bool isWritten = std::fwrite(&block.numRows, sizeof(block.numRows), 1, fFile.get()) == 1;
        for (std::size_t field = 0; field < fields.size() && isWritten; ++field)
            isWritten = std::fwrite(block.GetField(field), sizeof(double), block.numRows, fFile.get()) == block.numRows;
        if (!isWritten)
            ThrowSystemError("can't write a temporary file in " + directory);
    }
    if (std::fflush(fFile.get()) != 0)
        ThrowSystemError("can't write a temporary file in " + directory);
    std::rewind(fFile.get());

    for (const Field& field : fields)
    {
        std::vector<double> newCodes;
        if (field.use == Field::Use::kCategory && !field.isComplete)
        {
            for (const std::size_t rank : field.GetRanks()) newCodes.push_back(static_cast<double>(rank));
        }
        fNewCodes.push_back(newCodes);
    }
}

bool Spool::Next(Block& block)
{
    block.numRows = 0;
    if (std::fread(&block.numRows, sizeof(block.numRows), 1, fFile.get()) != 1)
    {
        if (std::ferror(fFile.get()) != 0)
            ThrowSystemError("can't read a temporary file");
        return false;
    }
    std::size_t field = 0;
    for (const bool isKept : fAreKept)
    {
        if (!isKept)
        {
            if (std::fseek(fFile.get(), static_cast<long>(block.numRows * sizeof(double)), SEEK_CUR) != 0)
                ThrowSystemError("can't read a temporary file");
            continue;
        }
        double* const values = block.GetField(field);
        if (std::fread(values, sizeof(double), block.numRows, fFile.get()) != block.numRows)
            ThrowSystemError("can't read a temporary file");
        const std::vector<double>& newCodes = fNewCodes[field++];
        for (std::size_t i = 0; i < block.numRows && !newCodes.empty(); ++i)
        {
            if (values[i] >= 0.0)
                values[i] = newCodes[static_cast<std::size_t>(values[i])];
        }
    }
    return true;
}

void Spool::Drop(std::size_t field)
{
    fNewCodes.erase(fNewCodes.begin() + static_cast<std::ptrdiff_t>(field));
    for (auto isKept = fAreKept.begin();; ++isKept)
    {
        if (*isKept && field-- == 0)
        {
            *isKept = false;
            return;
        }
    }
}
