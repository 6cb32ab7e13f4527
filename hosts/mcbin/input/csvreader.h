#ifndef MCBIN_CSVREADER_H
#define MCBIN_CSVREADER_H

#include "hosts/mcbin/input/inputfile.h"
#include "hosts/mcbin/input/rowtext.h"

#include <csv.h>

#include <cstddef>
#include <exception>
#include <memory>
#include <string>
#include <string_view>
#include <vector>

/// One row of a delimited text file. Its fields are good as long as the reader's documentation says.
class CsvRow
{
public:
    /// The number of fields, at least 1.
    std::size_t Size() const { return fFields.size(); }

    /// The field without its quotes. `index` must be below Size().
    std::string_view operator[](std::size_t index) const { return fFields[index]; }

    /// The row as it stands in the file.
    const RowText& GetText() const { return fRowText; }

    /// The line of the file on which the row begins, from 1.
    long GetLine() const { return fLine; }

private:
    friend class CsvReader;

    std::vector<std::string_view> fFields; ///< into fText, or into the reader's buffer for a row without quotes
    std::string fText;                     ///< all fields, one behind the other
    std::vector<std::size_t> fEnds;        ///< of the fields in fText
    RowText fRowText;                      ///< into the reader's buffer, or into what it keeps for the parser
    long fLine = 0;
};

/// Reads the rows of a delimited text file, of which it holds one buffer at a time.
///
/// Rows end with LF, CRLF or CR, and the last row needs no end. A field in double quotes may hold delimiters, line ends
/// and, doubled, quotes; quotes anywhere else are an error. Spaces around a field that isn't quoted are dropped, and so
/// are blank lines and a UTF-8 mark at the beginning. The row's text still has its spaces and quotes.
class CsvReader
{
public:
    /// A `delimiter` of '\0' stands for the one that the beginning of the file shows. Lines that begin with `comment` are
    /// dropped; '\0' stands for none.
    CsvReader(InputFile file, char delimiter, bool hasCommasInNumbers, char comment);

    /// The next row, which stays the reader's and is good until the next call, or null at the end.
    /// \throw Failure for a bad row, once all rows before it have been handed out, or if the file can't be read.
    const CsvRow* NextRow();

    /// Goes back to the first row of a file that can be rewound.
    void Rewind();

    const std::string& GetName() const { return fFile.GetName(); }
    char GetDelimiter() const { return fDelimiter; }
    /// The UTF-8 mark at the beginning of the file; empty if there is none.
    std::string_view GetMark() const;

private:
    struct ParserDeleter
    {
        void operator()(csv_parser* parser) const;
    };

    static void OnField(void* text, std::size_t size, void* reader);
    static void OnRowEnd(int terminator, void* reader);

    void ReadBeginning();
    bool FindLine();
    bool Refill();
    const char* FindSpecial(const char* end);
    bool SplitLine(std::string_view line);
    bool SkipComment();

    void ParseLine();
    void Parse(std::string_view text);
    void FinishParsing();
    template<class Work>
    void KeepFailure(Work work);
    void AddField(std::string_view text);
    void EndRow(int terminator);
    static const CsvRow& ShowFields(CsvRow& row);
    void Fail(const std::string& words);

    InputFile fFile;
    char fDelimiter;
    char fComment;
    std::unique_ptr<csv_parser, ParserDeleter> fParser;

    std::vector<char> fBuffer;
    const char* fBegin = nullptr;   ///< of what isn't handed out yet
    const char* fEnd = nullptr;     ///< of what has been read
    const char* fLineEnd = nullptr; ///< what FindLine() has found: behind the line end, or the end of the file
    const char* fSpecial = nullptr; ///< no quote or CR stands from fBegin up to here
    bool fFileRead = false;         ///< there is nothing behind the buffer
    bool fHasMark = false;

    CsvRow fPlainRow;
    RowCutter fCutter;           ///< has the text that the parser has got
    std::vector<CsvRow> fRows;   ///< the parser's fNumRows finished ones, then the one being read
    std::size_t fNumRows = 0;    ///< rows that the parser has finished
    std::size_t fNextRow = 0;    ///< the one of them that is handed out next
    bool fInRow = false;         ///< the parser waits for the rest of a row
    long fLine = 1;              ///< the line that the reader has come to
    int fLastTerminator = 0;     ///< what ended the parser's last line
    std::exception_ptr fFailure; ///< thrown once the rows before it have been handed out
};

#endif
