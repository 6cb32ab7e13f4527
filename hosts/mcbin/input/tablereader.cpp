#include "hosts/mcbin/input/tablereader.h"

#include "bins/numbers.h"
#include "hosts/mcbin/text.h"

#include <algorithm>
#include <stdexcept>
#include <utility>

namespace
{

NumberForm MakeNumberForm(const TableOptions& options)
{
    try
    {
        return NumberForm(options.decimal, options.thousands);
    }
    catch (const std::invalid_argument& error)
    {
        throw Failure(std::string("--thousands: ") + error.what());
    }
}

CsvReader Open(const TableOptions& options, const NumberForm& numbers)
{
    InputFile file(options.file);
    if (options.isReadTwice)
        file.MakeRewindable(options.spoolDirectory);
    return CsvReader(std::move(file), options.delimiter, numbers.HasCommas(), options.comment);
}

} // namespace

TableReader::TableReader(const TableOptions& options)
    : fNumbers(MakeNumberForm(options)), fReader(Open(options, fNumbers)), fHasHeader(options.hasHeader)
{
    if (options.comment != '\0' && options.comment == fReader.GetDelimiter())
        throw MakeFailure("--comment: " + Quote(std::string(1, options.comment)) + " separates the fields");
    const CsvRow* const first = fReader.NextRow();
    if (!first)
        throw MakeFailure(fHasHeader ? "the file is empty; its first line should name the columns"
                                     : "the file is empty");
    const RowText& text = first->GetText();
    fLineEnd = text.end.empty() ? "\n" : text.end;
    NameColumns(*first);
    if (fHasHeader)
        fHeader = std::string(fReader.GetMark()) + std::string(text.fields);
    else
        fFirstRow = first;
}

void TableReader::NameColumns(const CsvRow& header)
{
    std::vector<std::string> given;
    for (std::size_t i = 0; i < header.Size(); ++i)
    {
        const bool isNamed = fHasHeader && !header[i].empty();
        given.push_back(isNamed ? std::string(header[i]) : "column " + std::to_string(i + 1));
    }
    const auto isIn = [](const std::vector<std::string>& names, const std::string& name)
    { return std::find(names.begin(), names.end(), name) != names.end(); };
    for (std::size_t i = 0; i < given.size(); ++i)
    {
        std::string name = given[i];
        if (isIn(fColumnNames, name))
        {
            // A column that the file names "x_2" keeps its name, so that who asks for it gets no other one.
            for (int number = 2; isIn(fColumnNames, name) || isIn(given, name); ++number)
                name = given[i] + "_" + std::to_string(number);
            fNotes.push_back("another column is named " + Quote(given[i]) + ", so column " + std::to_string(i + 1) +
                             " is called " + Quote(name));
        }
        fColumnNames.push_back(name);
    }
}

std::size_t TableReader::FindColumn(const std::string& name) const
{
    const auto found = std::find(fColumnNames.begin(), fColumnNames.end(), name);
    if (found != fColumnNames.end())
        return static_cast<std::size_t>(found - fColumnNames.begin());
    constexpr std::size_t kMostNames = 20;
    std::vector<std::string> some;
    for (std::size_t i = 0; i < std::min(kMostNames, fColumnNames.size()); ++i)
        some.push_back(Quote(Shorten(fColumnNames[i])));
    const std::size_t others = fColumnNames.size() - some.size();
    throw MakeFailure("no column is named " + Quote(name) + "; there are " + Join(some, ", ") +
                      (others > 0 ? " and " + std::to_string(others) + " more" : ""));
}

const CsvRow* TableReader::NextRow()
{
    const CsvRow* const row = fFirstRow ? std::exchange(fFirstRow, nullptr) : fReader.NextRow();
    if (row && row->Size() != fColumnNames.size())
    {
        throw MakeFailure(row->GetLine(), "wrong number of fields: " + std::to_string(row->Size()) +
                                              (fHasHeader ? ", but the header has " : ", but the first row has ") +
                                              std::to_string(fColumnNames.size()));
    }
    return row;
}

void TableReader::Rewind()
{
    fReader.Rewind();
    fFirstRow = nullptr;
    if (fHasHeader)
        fReader.NextRow(); // it is known
}

Failure TableReader::MakeFailure(const std::string& words) const
{
    return Failure(fReader.GetName() + ": " + words);
}

Failure TableReader::MakeFailure(long line, const std::string& words) const
{
    return Failure(fReader.GetName() + ", line " + std::to_string(line) + ": " + words);
}

Failure TableReader::MakeFailure(long line, std::size_t column, const std::string& words) const
{
    return MakeFailure(line, "column " + Quote(fColumnNames[column]) + ": " + words);
}

Failure TableReader::MakeNotANumber(long line, std::size_t column, std::string_view field) const
{
    std::vector<std::string> ornaments;
    for (const char c : FindOrnaments(field)) ornaments.push_back(c == ',' ? "a comma" : "a " + std::string(1, c));
    const bool hasComma = std::find(ornaments.begin(), ornaments.end(), "a comma") != ornaments.end();
    const std::string advice = hasComma ? ", unless --decimal and --thousands say otherwise" : "";
    return MakeFailure(line, column,
                       Quote(Shorten(field)) +
                           (ornaments.empty()
                                ? " is not a number; if it stands for a missing value, say so with --missing-text, and "
                                  "with --bad missing for all such fields"
                                : " is not a number: it has " + Join(ornaments, " and ") +
                                      ", and numbers are written as in 1234.5" + advice));
}

Failure TableReader::MakeNotAWeight(long line, std::size_t column, std::string_view field, double weight) const
{
    return MakeFailure(line, column,
                       "the weight " + Quote(Shorten(field)) + (weight < 0.0 ? " is negative" : " is infinite") +
                           "; --bad missing leaves such rows out");
}
