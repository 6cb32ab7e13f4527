#include "hosts/mcbin/input/csvreader.h"

#include "hosts/mcbin/failure.h"
#include "hosts/mcbin/input/delimiter.h"

#include <algorithm>
#include <cstring>
#include <new>
#include <utility>

// Almost every line of almost every file has no quote. Such a line is a row, and is cut at its delimiters where it
// stands in the buffer: libcsv, which goes character by character and copies, needs six times as long. It gets the
// lines from one with a quote on, until the row that began there has ended; so libcsv deals with all that makes the
// format hard.

namespace
{

constexpr std::size_t kBufferSize = 1 << 16;
/// Behind a quote that is never closed, the rest of the file is one field, and memory would grow with it.
constexpr std::size_t kLongestField = 1 << 24;
constexpr std::size_t kLongestLine = std::size_t(1) << 30;
constexpr std::string_view kUtf8Mark = "\xEF\xBB\xBF";

csv_parser* MakeParser(char delimiter)
{
    auto parser = std::make_unique<csv_parser>();
    csv_init(parser.get(), CSV_STRICT | CSV_STRICT_FINI | CSV_REPALL_NL);
    csv_set_delim(parser.get(), static_cast<unsigned char>(delimiter));
    csv_set_blk_size(parser.get(), 1 << 16);
    return parser.release();
}

const char* Find(const char* begin, const char* end, char what)
{
    const void* const found = std::memchr(begin, what, static_cast<std::size_t>(end - begin));
    return found ? static_cast<const char*>(found) : end;
}

std::string_view MakeView(const char* begin, const char* end)
{
    return std::string_view(begin, static_cast<std::size_t>(end - begin));
}

/// The lines of the text that don't begin with the character.
std::string WithoutComments(std::string_view text, char comment)
{
    std::string lines;
    while (!text.empty())
    {
        const std::size_t size = std::min(text.find_first_of("\r\n"), text.size() - 1) + 1;
        if (comment == '\0' || text.front() != comment)
            lines += text.substr(0, size);
        text.remove_prefix(size);
    }
    return lines;
}

/// The text without the spaces around it.
inline std::string_view Trim(const char* begin, const char* end, char delimiter)
{
    // Above a space there is nothing to be dropped, and that is nearly every character.
    const auto isSpace = [delimiter](char c) { return c <= ' ' && (c == ' ' || c == '\t') && c != delimiter; };
    while (begin != end && isSpace(*begin)) ++begin;
    while (begin != end && isSpace(end[-1])) --end;
    return MakeView(begin, end);
}

} // namespace

void CsvReader::ParserDeleter::operator()(csv_parser* parser) const
{
    csv_free(parser);
    delete parser;
}

CsvReader::CsvReader(InputFile file, char delimiter, bool hasCommasInNumbers, char comment)
    : fFile(std::move(file)), fDelimiter(delimiter), fComment(comment), fBuffer(kBufferSize), fRows(1)
{
    ReadBeginning();
    if (fDelimiter == '\0')
        fDelimiter = DetectDelimiter(WithoutComments(MakeView(fBegin, fEnd), fComment), hasCommasInNumbers);
    fParser.reset(MakeParser(fDelimiter));
}

const CsvRow* CsvReader::NextRow()
{
    for (;;)
    {
        if (fNextRow < fNumRows)
            return &ShowFields(fRows[fNextRow++]);
        if (fFailure)
            std::rethrow_exception(fFailure);
        if (!FindLine())
        {
            if (!fInRow)
                return nullptr;
            FinishParsing();
        }
        else if (SkipComment())
            continue;
        else if (fInRow || FindSpecial(fLineEnd) < fLineEnd)
            ParseLine();
        else if (SplitLine(MakeView(std::exchange(fBegin, fLineEnd), fLineEnd)))
            return &fPlainRow;
    }
}

void CsvReader::Rewind()
{
    fFile.Rewind();
    ReadBeginning();
    fParser.reset(MakeParser(fDelimiter));
    fRows.assign(1, CsvRow());
    fNumRows = fNextRow = 0;
    fInRow = false;
    fFailure = nullptr;
    fCutter.Clear();
}

std::string_view CsvReader::GetMark() const
{
    return fHasMark ? kUtf8Mark : std::string_view();
}

void CsvReader::ReadBeginning()
{
    fBegin = fEnd = fSpecial = fBuffer.data();
    fFileRead = false;
    fLine = 1;
    fLastTerminator = 0;
    Refill();
    const std::string_view beginning = MakeView(fBegin, fEnd);
    fHasMark = beginning.substr(0, kUtf8Mark.size()) == kUtf8Mark;
    if (fHasMark)
        fBegin += kUtf8Mark.size();
    if (beginning.substr(0, 2) == "\xFF\xFE" || beginning.substr(0, 2) == "\xFE\xFF")
        throw Failure(GetName() + ": the file is UTF-16; make it UTF-8 first, as by iconv -f UTF-16 -t UTF-8");
    fSpecial = fBegin;
}

/// Finds the end of the line at fBegin, or of a part of it that is one for the parser. \return false at the end of the
/// file.
bool CsvReader::FindLine()
{
    const char* searched = fBegin;
    for (;;)
    {
        fLineEnd = Find(searched, fEnd, '\n');
        if (fLineEnd != fEnd)
        {
            ++fLineEnd;
            return true;
        }
        const std::ptrdiff_t size = fEnd - fBegin;
        if (static_cast<std::size_t>(size) == fBuffer.size())
        {
            // The parser takes parts of a line, too; so a file whose lines end with CR doesn't fill the memory. A CR at
            // the end waits for the LF that may follow.
            const char* const partEnd = fEnd[-1] == '\r' ? fEnd - 1 : fEnd;
            if (fInRow || FindSpecial(partEnd) < partEnd)
            {
                fLineEnd = partEnd;
                return true;
            }
        }
        if (!Refill())
        {
            fLineEnd = fEnd;
            return fBegin != fEnd;
        }
        searched = fBegin + size;
    }
}

/// Moves what is left to the front of the buffer, which grows if that fills it, and reads on behind it. \return false
/// if there is nothing more.
bool CsvReader::Refill()
{
    if (fFileRead)
        return false;
    const auto left = static_cast<std::size_t>(fEnd - fBegin);
    const std::ptrdiff_t unspecial = std::max(fSpecial, fBegin) - fBegin;
    std::memmove(fBuffer.data(), fBegin, left);
    if (left == fBuffer.size())
    {
        if (left >= kLongestLine)
            throw Failure(GetName() + ", line " + std::to_string(fLine) + ": longer than 1 GB");
        fBuffer.resize(2 * left);
    }
    const std::size_t size = fFile.Read(fBuffer.data() + left, fBuffer.size() - left);
    fFileRead = size < fBuffer.size() - left;
    fBegin = fBuffer.data();
    fEnd = fBegin + left + size;
    fSpecial = fBegin + unspecial;
    return size > 0;
}

/// The first quote before `end`, or a CR that isn't part of the line's CRLF; `end` if there is none.
const char* CsvReader::FindSpecial(const char* end)
{
    while (fSpecial < end)
    {
        const char* const quote = Find(std::max(fSpecial, fBegin), end, '"');
        const char* const back = Find(std::max(fSpecial, fBegin), quote, '\r');
        const bool isLineEnd = back != quote && back + 2 == end && back[1] == '\n';
        if (!isLineEnd && (back != quote || quote != end))
            return std::min(back, quote);
        fSpecial = end;
    }
    return end;
}

/// Drops the line at fBegin, if it is a comment. \return whether it was one.
bool CsvReader::SkipComment()
{
    if (fComment == '\0' || fInRow || *fBegin != fComment)
        return false;
    const char* const back = Find(fBegin, fLineEnd, '\r');
    const bool isPair = back != fLineEnd && back + 1 != fLineEnd && back[1] == '\n';
    fBegin = back == fLineEnd ? fLineEnd : back + (isPair ? 2 : 1);
    fLastTerminator = 0;
    ++fLine;
    return true;
}

/// \return false for a blank line.
bool CsvReader::SplitLine(std::string_view line)
{
    fPlainRow.fLine = fLine++;
    const std::string_view whole = line;
    if (!line.empty() && line.back() == '\n')
        line.remove_suffix(1);
    if (!line.empty() && line.back() == '\r')
        line.remove_suffix(1);
    fPlainRow.fRowText = {line, whole.substr(line.size())};

    std::vector<std::string_view>& fields = fPlainRow.fFields;
    fields.clear();
    const char* const end = line.data() + line.size();
    const char* begin = line.data();
    const auto addField = [&fields, this](const char* from, const char* to)
    {
        // Built in place from its two parts: to copy the whole view the processor would wait for both to be stored.
        const std::string_view field = Trim(from, to, fDelimiter);
        fields.emplace_back(field.data(), field.size());
    };
    for (const char* fieldEnd; (fieldEnd = Find(begin, end, fDelimiter)) != end; begin = fieldEnd + 1)
        addField(begin, fieldEnd);
    addField(begin, end);
    fLastTerminator = 0;
    return fPlainRow.Size() > 1 || !fPlainRow[0].empty();
}

/// Gives a line to the parser, and takes the rows that end in it.
void CsvReader::ParseLine()
{
    // The row that the last line has left unfinished goes on in this one.
    std::swap(fRows.front(), fRows[fNumRows]);
    fNumRows = 0;
    fNextRow = 0;
    fCutter.Append(MakeView(fBegin, fLineEnd));
    // The last character by itself: if it ends a row, and so isn't one of a quoted field, the parser is between rows.
    Parse(MakeView(std::exchange(fBegin, fLineEnd - 1), fLineEnd - 1));
    fInRow = true;
    Parse(MakeView(std::exchange(fBegin, fLineEnd), fLineEnd));
}

void CsvReader::Parse(std::string_view text)
{
    if (csv_parse(fParser.get(), text.data(), text.size(), OnField, OnRowEnd, this) != text.size())
    {
        if (csv_error(fParser.get()) != CSV_EPARSE)
            throw std::bad_alloc();
        Fail("a quote where none can be: a field that holds one must be quoted, and the quote in it doubled");
    }
    else if (csv_get_buffer_size(fParser.get()) > kLongestField)
        Fail("a field of more than 16 MB; is a closing quote missing?");
}

void CsvReader::FinishParsing()
{
    std::swap(fRows.front(), fRows[fNumRows]);
    fNumRows = 0;
    fNextRow = 0;
    fInRow = false;
    if (csv_fini(fParser.get(), OnField, OnRowEnd, this) != 0)
        Fail("a quoted field in this row is never closed");
}

// An exception must not pass through the C code between Parse and here.
template<class Work>
void CsvReader::KeepFailure(Work work)
{
    if (fFailure)
        return;
    try
    {
        work();
    }
    catch (...)
    {
        fFailure = std::current_exception();
    }
}

void CsvReader::OnField(void* text, std::size_t size, void* reader)
{
    CsvReader& self = *static_cast<CsvReader*>(reader);
    self.KeepFailure([&] { self.AddField(std::string_view(static_cast<const char*>(text), size)); });
}

void CsvReader::OnRowEnd(int terminator, void* reader)
{
    CsvReader& self = *static_cast<CsvReader*>(reader);
    self.KeepFailure([&] { self.EndRow(terminator); });
}

void CsvReader::AddField(std::string_view text)
{
    CsvRow& row = fRows[fNumRows];
    if (row.fEnds.empty())
        row.fLine = fLine;
    row.fText += text;
    row.fEnds.push_back(row.fText.size());
    fLine += std::count(text.begin(), text.end(), '\n');
}

void CsvReader::EndRow(int terminator)
{
    fInRow = false;
    const bool isBlank = fRows[fNumRows].fEnds.empty();
    const bool isSecondOfPair = isBlank && terminator == CSV_LF && fLastTerminator == CSV_CR;
    if (!isSecondOfPair)
        ++fLine;
    fLastTerminator = terminator;
    const RowText text = isSecondOfPair ? RowText() : fCutter.Cut();
    if (isBlank)
        return;
    fRows[fNumRows].fRowText = text;
    if (fRows.size() == fNumRows + 1)
        fRows.emplace_back();
    ++fNumRows;
    fRows[fNumRows].fText.clear();
    fRows[fNumRows].fEnds.clear();
}

/// The views of the fields, which are made when the row has come to its place.
const CsvRow& CsvReader::ShowFields(CsvRow& row)
{
    row.fFields.clear();
    const char* begin = row.fText.data();
    for (const std::size_t end : row.fEnds)
    {
        row.fFields.push_back(MakeView(begin, row.fText.data() + end));
        begin = row.fText.data() + end;
    }
    return row;
}

void CsvReader::Fail(const std::string& words)
{
    const CsvRow& row = fRows[fNumRows];
    const long line = row.fEnds.empty() ? fLine : row.fLine;
    if (!fFailure)
        fFailure = std::make_exception_ptr(Failure(GetName() + ", line " + std::to_string(line) + ": " + words));
}
