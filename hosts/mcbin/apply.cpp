#include "hosts/mcbin/apply.h"

#include "hosts/mcbin/binner.h"
#include "hosts/mcbin/failure.h"
#include "hosts/mcbin/figures.h"
#include "hosts/mcbin/input/jsoninput.h"
#include "hosts/mcbin/input/tablereader.h"
#include "hosts/mcbin/interrupt.h"
#include "hosts/mcbin/options.h"
#include "hosts/mcbin/output/csvoutput.h"
#include "hosts/mcbin/output/outputfile.h"
#include "hosts/mcbin/progress.h"
#include "hosts/mcbin/text.h"

#include <algorithm>
#include <optional>
#include <vector>

namespace
{

/// One column of the output that isn't the input's.
struct BinColumn
{
    std::size_t place; ///< of the attribute in the table
    std::string name;
    Binner binner;
    std::vector<std::string> fields; ///< by bin: what is written
};

std::vector<std::string> MakeFields(const Findings& findings, const Result& result, const ApplyOptions& options,
                                    char delimiter)
{
    std::vector<std::string> fields;
    for (std::size_t i = 0; i < result.bins.size(); ++i)
        fields.push_back(options.areLabels ? QuoteField(FormatBin(findings, result, result.bins[i]), delimiter)
                                           : std::to_string(i));
    return fields;
}

std::vector<BinColumn> MakeColumns(const TableReader& table, const Findings& findings, const ApplyOptions& options)
{
    std::vector<BinColumn> columns;
    for (const Result& result : findings.results)
    {
        if (result.cutPoints.empty())
            continue;
        const std::size_t place = table.FindColumn(findings.GetAttribute(result).name);
        const auto isSame = [place](const BinColumn& column) { return column.place == place; };
        if (options.isInPlace && std::any_of(columns.begin(), columns.end(), isSame))
            throw Failure("column " + Quote(findings.GetAttribute(result).name) +
                          " has been binned for more than one target, so its bins can't take its place");
        columns.push_back({place, GetBinColumn(findings, result), Binner(findings, result, options.missingText),
                           MakeFields(findings, result, options, table.GetDelimiter())});
    }
    if (columns.empty())
        throw Failure(options.bins + ": there is nothing to apply, as no attribute has cut points");
    return columns;
}

/// An output with two columns of one name would be no table to anybody, this tool included.
void ThrowIfTaken(const TableReader& table, const std::vector<BinColumn>& columns)
{
    const std::vector<std::string>& names = table.GetColumnNames();
    for (auto column = columns.begin(); column != columns.end(); ++column)
    {
        if (std::find(names.begin(), names.end(), column->name) != names.end())
            throw table.MakeFailure("there is a column " + Quote(column->name) +
                                    " already; --in-place-columns makes no new ones");
        const auto isSame = [column](const BinColumn& other) { return other.name == column->name; };
        const auto same = std::find_if(columns.begin(), column, isSame);
        if (same != column)
            throw table.MakeFailure("the bins of " + Quote(names[same->place]) + " and those of " +
                                    Quote(names[column->place]) + " would both be the column " + Quote(column->name));
    }
}

std::string MakeHeader(const TableReader& table, const std::vector<BinColumn>& columns, bool isInPlace)
{
    std::string header = table.GetHeader();
    if (!isInPlace)
        for (const BinColumn& column : columns)
            header += table.GetDelimiter() + QuoteField(column.name, table.GetDelimiter());
    return header + table.GetLineEnd();
}

[[noreturn]] void ThrowBadField(const TableReader& table, const CsvRow& row, const BinColumn& column)
{
    const std::string_view field = row[column.place];
    if (!column.binner.IsCategorical())
        throw table.MakeNotANumber(row.GetLine(), column.place, field);
    throw table.MakeFailure(row.GetLine(), column.place,
                            Quote(Shorten(field)) + " is a category that the bins don't know; with --bad missing it "
                                                    "counts as missing");
}

/// The field that is written for the row's value; empty for a missing one.
std::string_view FindField(const TableReader& table, const CsvRow& row, BinColumn& column, bool isBadMissing)
{
    const Binner::Place place = column.binner.Find(row[column.place]);
    if (place.isBad && !isBadMissing)
        ThrowBadField(table, row, column);
    return place.bin ? std::string_view(column.fields[*place.bin]) : std::string_view();
}

/// Writes rows: the input's fields as they stand there, some perhaps replaced, and further ones behind them.
class RowWriter
{
public:
    RowWriter(const TableReader& table, std::vector<BinColumn>& columns, const ApplyOptions& options)
        : fTable(table), fColumns(columns), fOptions(options), fOwn(table.GetColumnNames().size(), nullptr)
    {
        if (options.isInPlace)
            for (BinColumn& column : columns) fOwn[column.place] = &column;
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
            for (BinColumn& column : fColumns) Append(FindField(fTable, row, column, fOptions.isBadMissing));
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
    std::vector<BinColumn>& fColumns;
    const ApplyOptions& fOptions;
    std::vector<BinColumn*> fOwn;          ///< by column of the table: what replaces it, or null
    std::vector<std::string_view> fFields; ///< of the row at hand
    std::string fLine;
};

} // namespace

void ApplyBins(const ApplyOptions& options, Progress& progress)
{
    const Findings findings = ReadJson(options.bins);
    TableReader table(options.table);
    std::vector<BinColumn> columns = MakeColumns(table, findings, options);
    if (!options.isInPlace)
        ThrowIfTaken(table, columns);

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
}
