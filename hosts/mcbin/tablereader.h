#ifndef MCBIN_TABLEREADER_H
#define MCBIN_TABLEREADER_H

#include "csvreader.h"
#include "failure.h"

#include <cstddef>
#include <string>
#include <vector>

/// Reads a table: a CSV file whose first row names the columns, and whose every other row has a field for each of them.
/// A column without a name is called "column 1", "column 2", ... after its place.
class TableReader
{
public:
    /// \throw Failure if the file can't be read, is empty, or has two columns of one name.
    explicit TableReader(const std::string& path);

    const std::vector<std::string>& GetColumnNames() const { return fColumnNames; }

    /// The place of the column, from 0. \throw Failure, which tells what columns there are, if there is none of the name.
    std::size_t FindColumn(const std::string& name) const;

    /// The next row below the header, with as many fields as there are columns, or null at the end. It stays the
    /// reader's and is good until the next call. \throw Failure if the row is bad or can't be read.
    const CsvRow* NextRow();

    /// Goes back to the first row below the header. Only to be called when NextRow() has given null.
    void Rewind();

    /// What is wrong with the file, or with the row, with the place put in front.
    Failure MakeFailure(const std::string& words) const;
    Failure MakeFailure(const CsvRow& row, const std::string& words) const;

private:
    CsvReader fReader;
    std::vector<std::string> fColumnNames;
};

#endif
