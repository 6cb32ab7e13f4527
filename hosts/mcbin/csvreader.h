#ifndef MCBIN_CSVREADER_H
#define MCBIN_CSVREADER_H

#include <csv.h>

#include <cstddef>
#include <cstdio>
#include <exception>
#include <memory>
#include <string>
#include <string_view>
#include <vector>

/// One row of a CSV file.
class CsvRow
{
public:
    /// The number of fields, at least 1.
    std::size_t Size() const { return fEnds.size(); }

    /// The field without its quotes. `index` must be below Size().
    std::string_view operator[](std::size_t index) const;

    /// The line of the file on which the row begins, from 1.
    long GetLine() const { return fLine; }

private:
    friend class CsvReader;

    std::string fText; ///< all fields, one behind the other
    std::vector<std::size_t> fEnds;
    long fLine = 0;
};

/// Reads the rows of a CSV file, of which it holds one block at a time.
///
/// Fields are separated by commas, rows end with LF, CRLF or CR, and the last row needs no end. A field in double quotes
/// may hold commas, line ends and, doubled, quotes; quotes anywhere else are an error. Spaces around a field that isn't
/// quoted are dropped, and so are blank lines and a UTF-8 mark at the beginning.
class CsvReader
{
public:
    /// \throw Failure if the file can't be opened or, like a pipe, can't be read twice.
    explicit CsvReader(const std::string& path);

    /// The next row, which stays the reader's and is good until the next call, or null at the end.
    /// \throw Failure for a bad row, once all rows before it have been handed out, or if the file can't be read.
    const CsvRow* NextRow();

    /// Goes back to the first row. Only to be called when NextRow() has given null.
    void Rewind();

    const std::string& GetPath() const { return fPath; }

private:
    struct FileCloser
    {
        void operator()(std::FILE* file) const { std::fclose(file); }
    };
    struct ParserDeleter
    {
        void operator()(csv_parser* parser) const;
    };

    static void OnField(void* text, std::size_t size, void* reader);
    static void OnRowEnd(int terminator, void* reader);

    template<class Work>
    void KeepFailure(Work work);
    void ReadBlock();
    void Parse(std::string_view block, bool isLast);
    void AddField(std::string_view text);
    void EndRow(int terminator);
    void Fail(const std::string& words);

    std::string fPath;
    std::unique_ptr<std::FILE, FileCloser> fFile;
    std::unique_ptr<csv_parser, ParserDeleter> fParser;
    std::vector<char> fBlock;
    std::vector<CsvRow> fRows;   ///< the fNumRows finished ones of the block, then the one being read
    std::size_t fNumRows = 0;    ///< rows of the block that are finished
    std::size_t fNextRow = 0;    ///< the one of them that is handed out next
    long fLine = 1;              ///< the line that the parser has come to
    int fLastTerminator = 0;     ///< what ended the last line
    bool fAtEnd = false;         ///< the parser has seen the whole file
    std::exception_ptr fFailure; ///< thrown once the rows before it have been handed out
};

#endif
