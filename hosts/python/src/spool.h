#ifndef MCBINNING_SPOOL_H
#define MCBINNING_SPOOL_H

#include "hosts/python/src/blocks.h"
#include "hosts/python/src/field.h"

#include <cstdio>
#include <memory>
#include <string>
#include <vector>

/// Records that can be read only once and whose categories nobody knows before the end: they go through a file, so that
/// the codes can follow the order of the categories and not that of the records. The file has no name, and so is gone
/// with the process, whatever ends it.
class Spool : public BlockSource
{
public:
    /// Reads `source` to its end. \throw std::system_error if the file can't be made in `directory`, or written.
    Spool(BlockSource& source, const std::vector<Field>& fields, const std::string& directory);

    /// \throw std::system_error if the file can't be read.
    bool Next(Block& block) override;

    /// Begins again with the first record.
    void Rewind() { std::rewind(fFile.get()); }

    /// Leaves the field out from now on: later ones move down by one.
    void Drop(std::size_t field);

private:
    struct Close
    {
        void operator()(std::FILE* file) const { std::fclose(file); }
    };

    std::vector<bool> fAreKept; ///< by field of the file
    std::unique_ptr<std::FILE, Close> fFile;
    std::vector<std::vector<double>>
        fNewCodes; ///< by kept field and code of arrival; empty for a field without categories
};

#endif
