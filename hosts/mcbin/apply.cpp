#include "hosts/mcbin/apply.h"

#include "bins/binner.h"
#include "bins/csv.h"
#include "bins/encoding.h"
#include "bins/labels.h"
#include "bins/numbers.h"
#include "hosts/mcbin/failure.h"
#include "hosts/mcbin/input/jsoninput.h"
#include "hosts/mcbin/input/tablereader.h"
#include "hosts/mcbin/interrupt.h"
#include "hosts/mcbin/options.h"
#include "hosts/mcbin/output/outputfile.h"
#include "hosts/mcbin/progress.h"
#include "hosts/mcbin/text.h"

#include <algorithm>
#include <optional>
#include <vector>

namespace
{

/// One column of the output that isn't the input's.
struct OutputColumn
{
    std::size_t position; ///< of the attribute in the table
    const Variable* attribute;
    std::string name;
    Binner binner;
    std::vector<std::string> fields; ///< what is written: by bin, and behind them for a missing value
};

/// By bin, and behind them of a missing value, which may be empty.
std::vector<std::string> MakeFields(const AttributeBins& bins, Encoding encoding, char delimiter)
{
    std::vector<std::string> fields;
    const Codes codes = MakeCodes(bins, encoding);
    if (encoding == Encoding::kLabel)
    {
        for (const std::string& label : MakeLabels(bins)) fields.push_back(QuoteField(label, delimiter));
    }
    else
    {
        for (const double code : codes.bins) fields.push_back(FormatNumber(code));
    }
    fields.push_back(codes.missing ? FormatNumber(*codes.missing) : "");
    return fields;
}

std::vector<OutputColumn> MakeColumns(const TableReader& table, const Bins& bins, const ApplyOptions& options)
{
    std::vector<std::string> missingTexts = bins.missingTexts;
    missingTexts.insert(missingTexts.end(), options.missingText.begin(), options.missingText.end());
    std::vector<OutputColumn> columns;
    for (const BinColumn& column : MakeBinColumns(bins, table.GetColumnNames(), options.encoding))
    {
        const Variable& attribute = *column.bins->attribute;
        const std::size_t position = table.FindColumn(attribute.name);
        const auto isSame = [position](const OutputColumn& other) { return other.position == position; };
        if (options.isInPlace && std::any_of(columns.begin(), columns.end(), isSame))
        {
            throw Failure("column " + Quote(attribute.name) +
                          " has been binned for more than one target, so its bins can't take its place");
        }
        columns.push_back({position, &attribute, column.name, Binner(*column.bins, missingTexts, table.GetNumberForm()),
                           MakeFields(*column.bins, options.encoding, table.GetDelimiter())});
    }
    if (columns.empty())
        throw Failure(options.bins + ": there is nothing to apply, as no attribute has bins");
    return columns;
}

std::string MakeHeader(const TableReader& table, const std::vector<OutputColumn>& columns, bool isInPlace)
{
    if (!table.GetHeader())
        return std::string(table.GetMark());
    std::string header = *table.GetHeader();
    if (!isInPlace)
    {
        for (const OutputColumn& column : columns)
            header += table.GetDelimiter() + QuoteField(column.name, table.GetDelimiter());
    }
    return header + table.GetLineEnd();
}

[[noreturn]] void ThrowBadField(const TableReader& table, const CsvRow& row, const OutputColumn& column)
{
    const std::string_view field = row[column.position];
    if (!column.attribute->IsCategorical())
        throw table.MakeNotANumber(row.GetLine(), column.position, field);
    throw table.MakeFailure(row.GetLine(), column.position,
                            Quote(Shorten(field)) + " is a category that the bins don't know; with --bad missing it "
                                                    "counts as missing");
}

/// The field that is written for the row's value.
std::string_view FindField(const TableReader& table, const CsvRow& row, OutputColumn& column, bool isBadMissing)
{
    const Binner::Found found = column.binner.Find(row[column.position]);
    if (found.isBad && !isBadMissing)
        ThrowBadField(table, row, column);
    return found.bin ? column.fields[*found.bin] : column.fields.back();
}

/// Writes rows: the input's fields as they stand there, some perhaps replaced, and further ones behind them.
class RowWriter
{
public:
    RowWriter(const TableReader& table, std::vector<OutputColumn>& columns, const ApplyOptions& options)
        : fTable(table), fColumns(columns), fOptions(options), fOwn(table.GetColumnNames().size(), nullptr)
    {
        if (options.isInPlace)
        {
            for (OutputColumn& column : columns) fOwn[column.position] = &column;
        }
    }

    /// The line is the object's and good until the next call.
    const std::string& MakeLine(const CsvRow& row)
    {
        fLine.clear();
        if (fOptions.isInPlace)
            AppendReplaced(row);
        else
        {
            Append(row.GetText().fields);
            for (OutputColumn& column : fColumns) Append(FindField(fTable, row, column, fOptions.isBadMissing));
        }
        fLine.pop_back(); // the delimiter behind the last field
        // A line of a single empty field would be a blank one, which no reader counts.
        if (fLine.empty())
            fLine = "\"\"";
        fLine += row.GetText().end.empty() ? fTable.GetLineEnd() : row.GetText().end;
        return fLine;
    }

private:
    void AppendReplaced(const CsvRow& row)
    {
        SplitFields(row.GetText().fields, fTable.GetDelimiter(), fFields);
        for (std::size_t i = 0; i < fFields.size(); ++i)
            Append(fOwn[i] ? FindField(fTable, row, *fOwn[i], fOptions.isBadMissing) : fFields[i]);
    }

    void Append(std::string_view field)
    {
        fLine += field;
        fLine += fTable.GetDelimiter();
    }

    const TableReader& fTable;
    std::vector<OutputColumn>& fColumns;
    const ApplyOptions& fOptions;
    std::vector<OutputColumn*> fOwn;       ///< by column of the table: what replaces it, or null
    std::vector<std::string_view> fFields; ///< of the row at hand
    std::string fLine;
};

} // namespace

std::vector<std::string> ApplyBins(const ApplyOptions& options, Progress& progress)
{
    const Bins bins = ReadJson(options.bins);
    TableReader table(options.table);
    std::vector<OutputColumn> columns = MakeColumns(table, bins, options);

    OutputFile output(options.output);
    output.Write(MakeHeader(table, columns, options.isInPlace));
    RowWriter writer(table, columns, options);
    progress.BeginRows("applying the bins");
    while (const CsvRow* const row = table.NextRow())
    {
        progress.CountRow();
        output.Write(writer.MakeLine(*row));
    }
    ThrowIfInterrupted(); // the signal may have ended what writes the table, and come a moment later
    output.Commit();
    std::vector<std::string> notes = table.GetNotes();
    for (std::string& unbinned : DescribeUnbinned(bins)) notes.push_back(std::move(unbinned));
    return notes;
}
