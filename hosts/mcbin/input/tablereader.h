#ifndef MCBIN_TABLEREADER_H
#define MCBIN_TABLEREADER_H

#include "bins/numberform.h"
#include "hosts/mcbin/failure.h"
#include "hosts/mcbin/input/csvreader.h"

#include <cstddef>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

/// Where a table is and how it is written.
struct TableOptions
{
    std::string file;      ///< "-" for standard input
    char delimiter = '\0'; ///< '\0' for finding it
    char decimal = '.';    ///< of numbers, as NumberForm takes it, and so is the next
    char thousands = '\0';
    char comment = '\0';        ///< what a line begins with that is none of the table; '\0' for nothing
    bool hasHeader = true;      ///< the first row names the columns
    bool isReadTwice = false;   ///< or more often: Rewind() will be called
    std::string spoolDirectory; ///< for a copy of what can't be read twice by itself; empty for the library's default
};

/// Reads a table: a delimited file whose first row names the columns, unless there is no such row, and whose every
/// other row has a field for each of them. A column without a name is called "column 1", "column 2", ... after its
/// position, and one whose name another has before it gets the first of "_2", "_3", ... behind it that no other has.
class TableReader
{
public:
    /// \throw Failure if the file can't be read, or is empty.
    explicit TableReader(const TableOptions& options);

    const std::vector<std::string>& GetColumnNames() const { return fColumnNames; }
    /// The first row as it stands in the file, behind the file's UTF-8 mark if it has one, and without its line end.
    /// Nothing without a header.
    const std::optional<std::string>& GetHeader() const { return fHeader; }
    /// The file's UTF-8 mark; empty if it has none.
    std::string_view GetMark() const { return fReader.GetMark(); }
    /// What a user should know of the names of columns.
    const std::vector<std::string>& GetNotes() const { return fNotes; }
    /// What ends the first row; LF if nothing does.
    const std::string& GetLineEnd() const { return fLineEnd; }
    char GetDelimiter() const { return fReader.GetDelimiter(); }
    const NumberForm& GetNumberForm() const { return fNumbers; }
    const std::string& GetName() const { return fReader.GetName(); }

    /// The position of the column, from 0. \throw Failure, which tells what columns there are, if there is none of the
    /// name.
    std::size_t FindColumn(const std::string& name) const;

    /// The next row below the header, with as many fields as there are columns, or null at the end. It stays the
    /// reader's and is good until the next call. \throw Failure if the row is bad or can't be read.
    const CsvRow* NextRow();

    /// Goes back to the first row below the header of a table that is read more than once.
    void Rewind();

    /// What is wrong with the file, with the row, or with a field in it, with the line and the column put in front.
    Failure MakeFailure(const std::string& words) const;
    Failure MakeFailure(long line, const std::string& words) const;
    Failure MakeFailure(long line, std::size_t column, const std::string& words) const;

    /// The failure of a field that should be a number.
    Failure MakeNotANumber(long line, std::size_t column, std::string_view field) const;

    /// The failure of a number that is negative or infinite, and so no weight.
    Failure MakeNotAWeight(long line, std::size_t column, std::string_view field, double weight) const;

private:
    void NameColumns(const CsvRow& header);

    NumberForm fNumbers;
    CsvReader fReader;
    bool fHasHeader;
    const CsvRow* fFirstRow = nullptr; ///< of a table without a header, until it is handed out
    std::optional<std::string> fHeader;
    std::vector<std::string> fNotes;
    std::string fLineEnd;
    std::vector<std::string> fColumnNames;
};

#endif
