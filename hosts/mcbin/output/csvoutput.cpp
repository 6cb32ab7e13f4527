#include "hosts/mcbin/output/csvoutput.h"

#include "bins/numbers.h"
#include "hosts/mcbin/figures.h"
#include "hosts/mcbin/findings.h"
#include "hosts/mcbin/text.h"

#include <csv.h>

#include <algorithm>
#include <ostream>
#include <vector>

namespace
{

/// The targets of the results, each once.
std::vector<int> GetTargets(const Findings& findings)
{
    std::vector<int> targets;
    for (const Result& result : findings.results)
        if (result.target >= 0 && std::find(targets.begin(), targets.end(), result.target) == targets.end())
            targets.push_back(result.target);
    return targets;
}

std::vector<std::string> MakeHead(const Findings& findings, const std::vector<int>& targets)
{
    std::vector<std::string> head{"attribute", "target", "bin", "label", "left", "right", "closed", "weight", "share"};
    for (const int target : targets)
    {
        const Variable& variable = findings.variables[static_cast<std::size_t>(target)];
        for (const std::string& category : variable.categories)
            head.push_back("weight:" + (targets.size() > 1 ? variable.name + "=" : "") + category);
    }
    return head;
}

std::vector<std::string> MakeRow(const Findings& findings, const Result& result, std::size_t place,
                                 const std::vector<int>& targets)
{
    const Bin& bin = result.bins[place];
    const Variable* const ownTarget = findings.FindTarget(result);
    std::vector<std::string> row{findings.GetAttribute(result).name,
                                 ownTarget ? ownTarget->name : "",
                                 std::to_string(place),
                                 FormatBin(findings, result, bin),
                                 FormatNumber(bin.left),
                                 FormatNumber(bin.right),
                                 findings.settings.isRightClosed ? "right" : "left",
                                 FormatNumber(bin.weight),
                                 FormatNumber(GetShare(bin.weight, result.weight))};
    for (const int target : targets)
        for (std::size_t i = 0; i < findings.variables[static_cast<std::size_t>(target)].categories.size(); ++i)
            row.push_back(target == result.target ? FormatNumber(bin.weights[i]) : "");
    return row;
}

void PrintRow(std::ostream& os, std::vector<std::string> row)
{
    for (std::string& field : row) field = QuoteField(field, ',');
    os << Join(row, ",") << '\n';
}

} // namespace

std::string QuoteField(std::string_view field, char delimiter)
{
    const auto mustBeQuoted = [delimiter](char c) { return c == delimiter || c == '"' || c == '\n' || c == '\r'; };
    const bool hasOuterSpace = !field.empty() && (field.front() == ' ' || field.front() == '\t' ||
                                                  field.back() == ' ' || field.back() == '\t');
    if (!hasOuterSpace && std::none_of(field.begin(), field.end(), mustBeQuoted))
        return std::string(field);
    std::string quoted(2 * field.size() + 2, '\0');
    quoted.resize(csv_write(quoted.data(), quoted.size(), field.data(), field.size()));
    return quoted;
}

void PrintCsv(std::ostream& os, const Findings& findings)
{
    const std::vector<int> targets = GetTargets(findings);
    PrintRow(os, MakeHead(findings, targets));
    for (const Result& result : findings.results)
        for (std::size_t i = 0; i < result.bins.size(); ++i) PrintRow(os, MakeRow(findings, result, i, targets));
}
