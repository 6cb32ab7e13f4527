// The tool in one process: the first line of the input is its command line, the rest is the table. What it finds is
// written in every form, read back from JSON, and applied to the same table, where it has to fit every row; and the
// bins counted there have to weigh what the run has told.

#include "tests/fuzz/check.h"
#include "tests/fuzz/mcbin.h"
#include "tests/support/tempdir.h"

#include "bins/csv.h"
#include "bins/json.h"
#include "bins/labels.h"
#include "bins/numbers.h"
#include "bins/sql.h"
#include "hosts/mcbin/apply.h"
#include "hosts/mcbin/commandline/commandline.h"
#include "hosts/mcbin/failure.h"
#include "hosts/mcbin/input/jsoninput.h"
#include "hosts/mcbin/input/tablereader.h"
#include "hosts/mcbin/output/htmlreport.h"
#include "hosts/mcbin/output/tableoutput.h"
#include "hosts/mcbin/progress.h"
#include "hosts/mcbin/run.h"

#include <nlohmann/json.hpp>

#include <algorithm>
#include <cstddef>
#include <cstdint>
#include <map>
#include <optional>
#include <sstream>
#include <string>
#include <string_view>
#include <vector>

namespace
{

/// The words of the line, which are parted by blanks. The files are this program's own.
std::optional<BinOptions> Parse(const std::string& line, const TempDir& directory)
{
    std::istringstream stream(line);
    std::vector<std::string> words;
    words.emplace_back("mcbin");
    for (std::string word; stream >> word;) words.push_back(word);
    words.emplace_back("DATA");
    std::vector<const char*> arguments;
    for (const std::string& word : words) arguments.push_back(word.c_str());
    Request request;
    try
    {
        request = ParseCommandLine(static_cast<int>(arguments.size()), arguments.data());
    }
    catch (const UsageError&)
    {
        return std::nullopt;
    }
    if (request.command != Request::Command::kSupervised && request.command != Request::Command::kEqualFrequency)
        return std::nullopt;
    BinOptions options = request.bin;
    options.table.file = directory.File("table.csv");
    options.table.isReadTwice = true;
    options.tempDirectory = directory.Path();
    options.output = {};
    return options;
}

std::optional<Outcome> Find(const BinOptions& options)
{
    Progress progress(false);
    try
    {
        TableReader table(options.table);
        return FindBins(table, options, progress);
    }
    catch (const Failure&)
    {
        return std::nullopt; // in words, as it should be
    }
}

void PrintAll(const Outcome& outcome)
{
    std::ostringstream os;
    PrintTables(os, outcome, {80, true});
    PrintHtml(os, outcome);
    ToCsv(outcome.bins);
    ToSql(outcome.bins, {SqlDialect::kDuckDb, Encoding::kLabel, true, "t"});
}

ApplyOptions MakeApplyOptions(const BinOptions& options, const TempDir& directory, char delimiter)
{
    ApplyOptions apply;
    apply.bins = directory.File("bins.json");
    apply.table.file = options.table.file;
    apply.table.delimiter = delimiter;
    apply.output = directory.File("binned.csv");
    apply.missingText = options.columns.missingText;
    apply.isBadMissing = options.columns.isBadMissing;
    return apply;
}

/// A result, the weights of whose bins are counted again in the table with the new columns.
struct Recount
{
    const AttributeBins* result;
    std::size_t position;                     ///< of the column with the bins
    std::optional<std::size_t> target;        ///< the column of the target
    std::map<std::string, std::size_t> codes; ///< of the target
    std::vector<std::vector<double>> weights;
};

Recount MakeRecount(const TableReader& table, const BinColumn& column)
{
    const AttributeBins& bins = *column.bins;
    Recount recount{&bins, table.FindColumn(column.name), std::nullopt, {}, {}};
    std::size_t numCodes = 1;
    if (bins.target)
    {
        recount.target = table.FindColumn(bins.target->name);
        for (const std::string& category : bins.target->categories)
            recount.codes.emplace(category, recount.codes.size());
        numCodes = bins.target->categories.size();
    }
    recount.weights.assign(bins.bins.size(), std::vector<double>(numCodes, 0.0));
    return recount;
}

/// The category that the field of a target stands for.
std::string ToCategory(const Variable& target, std::string_view field)
{
    const std::optional<double> number = ParseNumber(field);
    const bool isNumber = target.kind == VariableKind::kNumericCategorical && number;
    return isNumber ? FormatCategoryNumber(*number) : std::string(field);
}

void Count(Recount& recount, const CsvRow& row)
{
    const std::string bin(row[recount.position]);
    if (bin.empty())
        return;
    Check(std::stoul(bin) < recount.weights.size(), "a bin that there is not");
    std::size_t code = 0;
    if (recount.target)
    {
        const auto found = recount.codes.find(ToCategory(*recount.result->target, row[*recount.target]));
        if (found == recount.codes.end())
            return; // missing
        code = found->second;
    }
    recount.weights[std::stoul(bin)][code] += 1.0;
}

void CheckRecount(const Recount& recount)
{
    for (std::size_t i = 0; i < recount.weights.size(); ++i)
    {
        const Bin& bin = recount.result->bins[i];
        if (recount.weights[i] != (recount.target ? bin.weights : std::vector<double>{bin.weight}))
            Fail("the weight of bin " + std::to_string(i) + " of " + recount.result->attribute->name);
    }
}

void CheckBinned(const Bins& bins, const std::vector<std::string>& taken, const ApplyOptions& apply)
{
    TableOptions options;
    options.file = apply.output;
    options.delimiter = apply.table.delimiter;
    TableReader table(options);
    std::vector<Recount> recounts;
    for (const BinColumn& column : MakeBinColumns(bins, taken)) recounts.push_back(MakeRecount(table, column));
    while (const CsvRow* const row = table.NextRow())
    {
        for (Recount& recount : recounts) Count(recount, *row);
    }
    for (const Recount& recount : recounts) CheckRecount(recount);
}

void CheckSums(const Bins& bins)
{
    for (const AttributeBins& result : bins.results)
    {
        Check(result.bins.empty() || result.bins.size() == result.cutPoints.size() + 1, "number of bins");
        Check(std::adjacent_find(result.cutPoints.begin(), result.cutPoints.end(),
                                 [](double a, double b) { return !(a < b); }) == result.cutPoints.end(),
              "the cut points don't rise");
    }
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* bytes, std::size_t size)
{
    static const TempDir directory;
    const std::string_view text(reinterpret_cast<const char*>(bytes), size);
    const std::size_t end = std::min(text.find('\n'), text.size());
    const std::optional<BinOptions> options = Parse(std::string(text.substr(0, end)), directory);
    if (!options)
        return -1; // not worth keeping
    WriteFile(options->table.file, text.substr(std::min(end + 1, text.size())));

    const std::optional<Outcome> outcome = Find(*options);
    if (!outcome)
        return 0;
    const Bins& bins = outcome->bins;
    CheckSums(bins);
    PrintAll(*outcome);
    const std::string json = ToJson(bins);
    TableReader table(options->table);
    const ApplyOptions apply = MakeApplyOptions(*options, directory, table.GetDelimiter());
    WriteFile(apply.bins, json);
    // As documents, since -0 is read as a whole number, and so as 0.
    Check(nlohmann::json::parse(json) == nlohmann::json::parse(ToJson(ReadJson(apply.bins))),
          "JSON that is read and written again differs");

    if (MakeBinColumns(bins, {}).empty())
        return 0;
    Progress progress(false);
    ApplyBins(apply, progress);
    if (options->columns.weight.empty())
        CheckBinned(bins, table.GetColumnNames(), apply);
    return 0;
}
