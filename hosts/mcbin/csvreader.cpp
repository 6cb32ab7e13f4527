#include "csvreader.h"

#include "failure.h"

#include <algorithm>
#include <cerrno>
#include <cstring>
#include <filesystem>
#include <new>
#include <utility>

// libcsv calls back for each field and each line end, and can't be halted in between. So all rows of a block are
// collected, and then handed out one by one.

namespace
{

constexpr std::size_t kBlockSize = 1 << 16;
/// Behind a quote that is never closed, the rest of the file is one field, and memory would grow with it.
constexpr std::size_t kLongestField = 1 << 24;
constexpr std::string_view kUtf8Mark = "\xEF\xBB\xBF";

std::FILE* Open(const std::string& path)
{
    // Asked first, as to open a pipe would wait for its other end.
    std::error_code error;
    const std::filesystem::file_status status = std::filesystem::status(path, error);
    if (std::filesystem::exists(status) && !std::filesystem::is_regular_file(status))
        throw Failure(path + ": not a regular file; it has to be one, as it is read twice");
    std::FILE* const file = std::fopen(path.c_str(), "rb");
    if (!file)
        throw Failure(path + ": " + std::strerror(errno));
    return file;
}

csv_parser* MakeParser()
{
    auto parser = std::make_unique<csv_parser>();
    csv_init(parser.get(), CSV_STRICT | CSV_STRICT_FINI | CSV_REPALL_NL);
    csv_set_blk_size(parser.get(), kBlockSize);
    return parser.release();
}

} // namespace

std::string_view CsvRow::operator[](std::size_t index) const
{
    const std::size_t begin = index == 0 ? 0 : fEnds[index - 1];
    return std::string_view(fText).substr(begin, fEnds[index] - begin);
}

void CsvReader::ParserDeleter::operator()(csv_parser* parser) const
{
    csv_free(parser);
    delete parser;
}

CsvReader::CsvReader(const std::string& path)
    : fPath(path), fFile(Open(path)), fParser(MakeParser()), fBlock(kBlockSize), fRows(1)
{
}

const CsvRow* CsvReader::NextRow()
{
    while (fNextRow == fNumRows && !fAtEnd && !fFailure) ReadBlock();
    if (fNextRow < fNumRows)
        return &fRows[fNextRow++];
    if (fFailure)
        std::rethrow_exception(fFailure);
    return nullptr;
}

void CsvReader::Rewind()
{
    std::rewind(fFile.get());
    fLine = 1;
    fLastTerminator = 0;
    fAtEnd = false;
}

void CsvReader::ReadBlock()
{
    // The row that the last block has left unfinished goes on in this one.
    std::swap(fRows.front(), fRows[fNumRows]);
    fNumRows = 0;
    fNextRow = 0;

    const bool isFirst = std::ftell(fFile.get()) == 0;
    const std::size_t size = std::fread(fBlock.data(), 1, fBlock.size(), fFile.get());
    if (std::ferror(fFile.get()))
        throw Failure(fPath + ": " + std::strerror(errno));
    std::string_view block(fBlock.data(), size);
    if (isFirst && block.substr(0, kUtf8Mark.size()) == kUtf8Mark)
        block.remove_prefix(kUtf8Mark.size());
    Parse(block, size < fBlock.size());
}

void CsvReader::Parse(std::string_view block, bool isLast)
{
    bool isParsed = csv_parse(fParser.get(), block.data(), block.size(), OnField, OnRowEnd, this) == block.size();
    if (isParsed && isLast)
    {
        isParsed = csv_fini(fParser.get(), OnField, OnRowEnd, this) == 0;
        fAtEnd = true;
        if (!isParsed)
            Fail("a quoted field in this row is never closed");
    }
    else if (!isParsed && csv_error(fParser.get()) == CSV_EPARSE)
        Fail("a quote in the wrong place: a field that holds one must be quoted, and the quote in it doubled");
    else if (!isParsed)
        throw std::bad_alloc();
    else if (csv_get_buffer_size(fParser.get()) > kLongestField)
        Fail("a field of more than 16 MB; is a closing quote missing?");
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
    const bool isBlank = fRows[fNumRows].fEnds.empty();
    const bool isSecondOfPair = isBlank && terminator == CSV_LF && fLastTerminator == CSV_CR;
    if (!isSecondOfPair)
        ++fLine;
    fLastTerminator = terminator;
    if (isBlank)
        return;
    if (fRows.size() == fNumRows + 1)
        fRows.emplace_back();
    ++fNumRows;
    fRows[fNumRows].fText.clear();
    fRows[fNumRows].fEnds.clear();
}

void CsvReader::Fail(const std::string& words)
{
    const CsvRow& row = fRows[fNumRows];
    const long line = row.fEnds.empty() ? fLine : row.fLine;
    if (!fFailure)
        fFailure = std::make_exception_ptr(Failure(fPath + ", line " + std::to_string(line) + ": " + words));
}
