#include "tableoutput.h"

#include "figures.h"
#include "findings.h"
#include "numbers.h"
#include "sharebar.h"
#include "statuswords.h"
#include "text.h"

#include <fmt/format.h>

#include <algorithm>
#include <ostream>
#include <string>
#include <vector>

namespace
{

constexpr std::size_t kWidestBar = 30;
constexpr std::size_t kNarrowestBar = 10;
/// So many categories have a column each where the width doesn't limit them.
constexpr std::size_t kMostCategoryColumns = 12;

std::string FormatFigure(const std::optional<double>& figure)
{
    return figure ? FormatNumber(*figure) : "none";
}

/// 1 - 0.1 - 0.2 must not end in a row of digits that no one has weighed.
std::string FormatDerived(double value)
{
    return fmt::format("{:.12g}", value);
}

std::string GetHeading(const Findings& findings, const Result& result)
{
    const Variable* const target = findings.FindTarget(result);
    const std::string name = Printable(findings.GetAttribute(result).name);
    return target ? name + " by " + Printable(target->name) : name;
}

void PrintHeading(std::ostream& os, const Findings& findings, const Result& result, const Screen& screen)
{
    const std::string heading = GetHeading(findings, result);
    os << (screen.hasColours ? "\x1b[1m" + heading + "\x1b[0m" : heading);
    if (result.targetEntropy && result.modelEntropy)
        os << fmt::format(": gain {:.4f} bits, {:.1f}%", GetGain(result),
                          100.0 * GetShare(GetGain(result), *result.targetEntropy));
    os << '\n';
    if (result.targetEntropy && result.modelEntropy)
        os << "  entropy " << FormatNumber(*result.targetEntropy) << " before, " << FormatNumber(*result.modelEntropy)
           << " after\n";
    os << "  " << result.distinctValues << " distinct values from " << FormatFigure(result.minimum) << " to "
       << FormatFigure(result.maximum) << ", missing weight " << FormatDerived(result.weightWithMissing - result.weight)
       << '\n';
}

bool HasTwoCategories(const Findings& findings, const Result& result)
{
    const Variable* const target = findings.FindTarget(result);
    return target && target->categories.size() == 2;
}

/// The categories that have a column of their own: the heaviest `number` of them, in the order of their codes.
std::vector<std::size_t> ChooseCategories(const std::vector<double>& weights, std::size_t number)
{
    std::vector<std::size_t> codes(weights.size());
    for (std::size_t i = 0; i < codes.size(); ++i) codes[i] = i;
    std::stable_sort(codes.begin(), codes.end(), [&](std::size_t a, std::size_t b) { return weights[a] > weights[b]; });
    codes.resize(std::min(codes.size(), number));
    std::sort(codes.begin(), codes.end());
    return codes;
}

std::vector<std::string> MakeHead(const Findings& findings, const Result& result, const std::vector<std::size_t>& codes)
{
    std::vector<std::string> head{"bin", "weight", "share"};
    const Variable* const target = findings.FindTarget(result);
    if (!target)
        return head;
    for (const std::size_t code : codes) head.push_back(Printable(Shorten(target->categories[code])));
    if (codes.size() < target->categories.size())
        head.emplace_back("others");
    if (HasTwoCategories(findings, result))
        head.insert(head.end(), {"rate", "WoE", "IV"});
    return head;
}

void AppendCategories(std::vector<std::string>& row, const Bin& bin, const std::vector<std::size_t>& codes)
{
    double others = bin.weight;
    for (const std::size_t code : codes)
    {
        row.push_back(FormatNumber(bin.weights[code]));
        others -= bin.weights[code];
    }
    if (codes.size() < bin.weights.size())
        row.push_back(FormatDerived(others));
}

std::vector<std::string> MakeRow(const Findings& findings, const Result& result, const Bin& bin,
                                 const std::vector<double>& categoryWeights, const std::vector<std::size_t>& codes)
{
    std::vector<std::string> row{Printable(FormatBin(findings, result, bin)), FormatNumber(bin.weight),
                                 fmt::format("{:.1f}%", 100.0 * GetShare(bin.weight, result.weight))};
    AppendCategories(row, bin, codes);
    if (HasTwoCategories(findings, result))
    {
        row.push_back(fmt::format("{:.1f}%", 100.0 * GetShare(bin.weights[1], bin.weight)));
        row.push_back(fmt::format("{:+.3f}", GetWeightOfEvidence(bin, categoryWeights)));
        row.push_back(fmt::format("{:.4f}", GetInformationValue(bin, categoryWeights)));
    }
    return row;
}

std::vector<std::size_t> GetWidths(const std::vector<std::vector<std::string>>& rows)
{
    std::vector<std::size_t> widths(rows.front().size());
    for (const std::vector<std::string>& row : rows)
        for (std::size_t i = 0; i < row.size(); ++i) widths[i] = std::max(widths[i], GetWidth(row[i]));
    return widths;
}

/// The cells of a row in their columns: the first to the left, the others to the right.
std::string Align(const std::vector<std::string>& row, const std::vector<std::size_t>& widths)
{
    std::string line = "  " + PadRight(row.front(), widths.front());
    for (std::size_t i = 1; i < row.size(); ++i) line += "  " + PadLeft(row[i], widths[i]);
    return line;
}

std::vector<std::vector<std::string>> MakeRows(const Findings& findings, const Result& result, std::size_t nCategories)
{
    const std::vector<double> categoryWeights = GetCategoryWeights(result);
    const std::vector<std::size_t> codes = ChooseCategories(categoryWeights, nCategories);
    std::vector<std::vector<std::string>> rows{MakeHead(findings, result, codes)};
    for (const Bin& bin : result.bins) rows.push_back(MakeRow(findings, result, bin, categoryWeights, codes));
    return rows;
}

/// As many categories as fit beside the narrowest bar.
std::vector<std::vector<std::string>> FitRows(const Findings& findings, const Result& result, const Screen& screen)
{
    std::size_t nCategories = std::min(kMostCategoryColumns, GetCategoryWeights(result).size());
    std::vector<std::vector<std::string>> rows = MakeRows(findings, result, nCategories);
    const auto isTooWide = [&]
    { return screen.width && GetWidth(Align(rows.front(), GetWidths(rows))) + 2 + kNarrowestBar > *screen.width; };
    while (nCategories > 1 && isTooWide()) rows = MakeRows(findings, result, --nCategories);
    return rows;
}

void PrintBins(std::ostream& os, const Findings& findings, const Result& result, const Screen& screen)
{
    const std::vector<std::vector<std::string>> rows = FitRows(findings, result, screen);
    const std::vector<std::size_t> widths = GetWidths(rows);
    const std::string head = Align(rows.front(), widths);
    const std::size_t left = screen.width.value_or(1000) - std::min(screen.width.value_or(1000), GetWidth(head) + 2);
    const ShareBar bar(findings, result, left < kNarrowestBar ? 0 : std::min(left, kWidestBar), screen.hasColours);
    os << head << '\n';
    for (std::size_t i = 0; i < result.bins.size(); ++i)
        os << Align(rows[i + 1], widths) << bar.Draw(result.bins[i]) << '\n';
    os << bar.GetLegend();
    if (HasTwoCategories(findings, result))
        os << "  rate and WoE of " << Quote(findings.FindTarget(result)->categories[1]) << "; information value "
           << fmt::format("{:.4f}", GetInformationValue(result)) << '\n';
}

/// With an error or a warning about an attribute that has cut points all the same.
void PrintStatus(std::ostream& os, const Result& result)
{
    if (!result.status.IsOK())
        os << "  " << DescribeStatus(result.status) << '\n';
}

void PrintUncut(std::ostream& os, const Findings& findings)
{
    const std::vector<const Result*> uncut = GetUncut(findings);
    if (uncut.empty())
        return;
    std::size_t width = 0;
    for (const Result* const result : uncut) width = std::max(width, GetWidth(GetHeading(findings, *result)));
    os << "Without cut points:\n";
    for (const Result* const result : uncut)
        os << "  " << PadRight(GetHeading(findings, *result), width) << "  " << DescribeStatus(result->status) << '\n';
    os << '\n';
}

} // namespace

void PrintTables(std::ostream& os, const Findings& findings, const Screen& screen)
{
    for (const Result* const result : SortByGain(findings))
    {
        PrintHeading(os, findings, *result, screen);
        PrintBins(os, findings, *result, screen);
        PrintStatus(os, *result);
        os << '\n';
    }
    PrintUncut(os, findings);
    if (!findings.leftOut.empty())
        os << "Left out, as they hold text: " << Join(findings.leftOut, ", ") << '\n';
}
