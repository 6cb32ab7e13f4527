// The tool in one process: the first line of the input is its command line, the rest is the table. What it finds is
// written in every form, read back from JSON, and applied to the same table, where it has to fit every row; and the bins
// counted there have to weigh what the run has told.

#include "tests/fuzz/check.h"
#include "tests/fuzz/mcbin.h"
#include "tests/support/tempdir.h"

#include "hosts/mcbin/apply.h"
#include "hosts/mcbin/commandline.h"
#include "hosts/mcbin/failure.h"
#include "hosts/mcbin/figures.h"
#include "hosts/mcbin/findings.h"
#include "hosts/mcbin/input/jsoninput.h"
#include "hosts/mcbin/input/tablereader.h"
#include "hosts/mcbin/output/csvoutput.h"
#include "hosts/mcbin/output/htmlreport.h"
#include "hosts/mcbin/output/jsonoutput.h"
#include "hosts/mcbin/output/sqloutput.h"
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
    for (std::string word; stream >> word;) words.insert(words.begin(), word); // backwards, as CLI11 takes them
    words.insert(words.begin(), "DATA");
    Request request;
    const std::unique_ptr<CLI::App> app = MakeCommandLine(request);
    try
    {
        app->parse(words);
    }
    catch (const CLI::Error&) // help is one, too
    {
        return std::nullopt;
    }
    if (request.isManPage || request.command == Request::Command::kApply)
        return std::nullopt;
    BinOptions options = request.bin;
    options.table.file = directory.File("table.csv");
    options.table.isReadTwice = true;
    options.settings.tempDirectory = directory.Path();
    options.output = {};
    return options;
}

std::optional<Findings> Find(const BinOptions& options)
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

void PrintAll(const Findings& findings)
{
    std::ostringstream os;
    PrintTables(os, findings, {80, true});
    PrintCsv(os, findings);
    PrintSql(os, findings);
    PrintHtml(os, findings);
}

bool HasCuts(const Result& result)
{
    return !result.cutPoints.empty();
}

/// Whether a new column would have the name of another one.
bool IsTaken(const Findings& findings, std::vector<std::string> names)
{
    for (const Result& result : findings.results)
    {
        if (!HasCuts(result))
            continue;
        names.push_back(GetBinColumn(findings, result));
        if (std::count(names.begin(), names.end(), names.back()) > 1)
            return true;
    }
    return false;
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
    const Result* result;
    std::size_t place;                        ///< of the column with the bins
    std::optional<std::size_t> target;        ///< the column of the target
    std::map<std::string, std::size_t> codes; ///< of the target
    std::vector<std::vector<double>> weights;
};

Recount MakeRecount(const TableReader& table, const Findings& findings, const Result& result)
{
    Recount recount{&result, table.FindColumn(GetBinColumn(findings, result)), std::nullopt, {}, {}};
    std::size_t numCodes = 1;
    if (const Variable* const target = findings.FindTarget(result))
    {
        recount.target = table.FindColumn(target->name);
        for (const std::string& category : target->categories) recount.codes.emplace(category, recount.codes.size());
        numCodes = target->categories.size();
    }
    recount.weights.assign(result.bins.size(), std::vector<double>(numCodes, 0.0));
    return recount;
}

void Count(Recount& recount, const CsvRow& row)
{
    const std::string bin(row[recount.place]);
    if (bin.empty())
        return;
    Check(std::stoul(bin) < recount.weights.size(), "a bin that there is not");
    std::size_t code = 0;
    if (recount.target)
    {
        const auto found = recount.codes.find(std::string(row[*recount.target]));
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
            Fail("the weight of bin " + std::to_string(i) + " of " + std::to_string(recount.result->attribute));
    }
}

void CheckBinned(const Findings& findings, const ApplyOptions& apply)
{
    TableOptions options;
    options.file = apply.output;
    options.delimiter = apply.table.delimiter;
    TableReader table(options);
    std::vector<Recount> recounts;
    for (const Result& result : findings.results)
        if (HasCuts(result))
            recounts.push_back(MakeRecount(table, findings, result));
    while (const CsvRow* const row = table.NextRow())
        for (Recount& recount : recounts) Count(recount, *row);
    for (const Recount& recount : recounts) CheckRecount(recount);
}

void CheckSums(const Findings& findings)
{
    for (const Result& result : findings.results)
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

    const std::optional<Findings> findings = Find(*options);
    if (!findings)
        return 0;
    CheckSums(*findings);
    PrintAll(*findings);
    std::ostringstream json;
    PrintJson(json, *findings);
    TableReader table(options->table);
    const ApplyOptions apply = MakeApplyOptions(*options, directory, table.GetDelimiter());
    WriteFile(apply.bins, json.str());
    const Findings readBack = ReadJson(apply.bins);
    std::ostringstream jsonAgain;
    PrintJson(jsonAgain, readBack);
    // As documents, since -0 is read as a whole number, and so as 0.
    Check(nlohmann::json::parse(json.str()) == nlohmann::json::parse(jsonAgain.str()),
          "JSON that is read and written again differs");

    const auto& results = findings->results;
    if (std::none_of(results.begin(), results.end(), HasCuts) || IsTaken(*findings, table.GetColumnNames()))
        return 0;
    Progress progress(false);
    ApplyBins(apply, progress);
    if (options->columns.weight.empty())
        CheckBinned(*findings, apply);
    return 0;
}
