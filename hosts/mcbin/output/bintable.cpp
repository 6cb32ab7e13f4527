#include "hosts/mcbin/output/bintable.h"

#include "bins/numbers.h"
#include "bins/utf8.h"
#include "hosts/mcbin/figures.h"
#include "hosts/mcbin/findings.h"
#include "hosts/mcbin/output/sharebar.h"
#include "hosts/mcbin/text.h"

#include <fmt/format.h>

#include <algorithm>
#include <optional>
#include <ostream>
#include <string>
#include <vector>

namespace
{

using Rows = std::vector<std::vector<std::string>>;

constexpr std::size_t kWidestBar = 30;
constexpr std::size_t kNarrowestBar = 10;
constexpr std::size_t kWidestLabel = 60;
/// So many categories have a column each where the width doesn't limit them.
constexpr std::size_t kMostCategoryColumns = 12;

/// What a table shows beside the bin, its weight and its share.
struct Extent
{
    std::size_t nCategories; ///< how many have a column of their own; the others share one, unless this is 0
    std::size_t nRates;      ///< how many of rate, weight of evidence and information value, in this order
    bool hasBar;
    std::size_t labelWidth; ///< a set of categories is cut off at it
};

Extent MakeWidest(const Findings& findings, const Result& result, const Screen& screen)
{
    constexpr std::size_t kNumRates = 3;
    const Variable* const target = findings.FindTarget(result);
    return {std::min(kMostCategoryColumns, target ? target->categories.size() : 0),
            HasTwoCategories(findings, result) ? kNumRates : 0, true,
            std::min(kWidestLabel, screen.width.value_or(2 * kWidestLabel) / 2)};
}

/// Gives up what is missed least: of many categories the lightest, of two the bar, as the rate says the same.
/// \return false if there is nothing more to give up.
bool Narrow(Extent& extent)
{
    if (extent.nCategories > 1 && extent.nRates == 0)
        --extent.nCategories;
    else if (extent.hasBar)
        extent.hasBar = false;
    else if (extent.nCategories > 0)
        extent.nCategories = 0;
    else if (extent.nRates > 0)
        --extent.nRates;
    else
        return false;
    return true;
}

std::vector<std::string> MakeHead(const Findings& findings, const Result& result, const std::vector<std::size_t>& codes,
                                  const Extent& extent)
{
    const std::vector<std::string> rates{"rate", "WoE", "IV"};
    std::vector<std::string> head{"bin", "weight", "share"};
    for (const std::size_t code : codes)
        head.push_back(Printable(Shorten(findings.FindTarget(result)->categories[code])));
    if (!codes.empty() && codes.size() < findings.FindTarget(result)->categories.size())
        head.emplace_back("others");
    head.insert(head.end(), rates.begin(), rates.begin() + static_cast<std::ptrdiff_t>(extent.nRates));
    return head;
}

/// The interval, or as many of the bin's categories as have room.
std::string MakeLabel(const Findings& findings, const Result& result, const Bin& bin, std::size_t width)
{
    std::string label = Printable(FormatBin(findings, result, bin));
    std::vector<std::string> categories = GetBinCategories(findings, result, bin);
    if (categories.empty() || GetWidth(label) <= width)
        return label;
    for (std::string& category : categories) category = Printable(Shorten(category, width / 2));
    const std::size_t number = categories.size();
    const auto format = [&]
    {
        const std::string more = fmt::format(", {} more", number - categories.size());
        return "{" + Join(categories, ", ") + (categories.size() < number ? more : "") + "}";
    };
    while (categories.size() > 1 && GetWidth(format()) > width) categories.pop_back();
    return format();
}

void AppendCategories(std::vector<std::string>& row, const Bin& bin, const std::vector<std::size_t>& codes)
{
    double others = bin.weight;
    for (const std::size_t code : codes)
    {
        row.push_back(FormatWeight(bin.weights[code]));
        others -= bin.weights[code];
    }
    if (!codes.empty() && codes.size() < bin.weights.size())
        row.push_back(FormatWeight(others));
}

std::vector<std::string> MakeRow(const Findings& findings, const Result& result, const Bin& bin,
                                 const std::vector<double>& categoryWeights, const std::vector<std::size_t>& codes,
                                 const Extent& extent)
{
    std::vector<std::string> row{MakeLabel(findings, result, bin, extent.labelWidth), FormatWeight(bin.weight),
                                 fmt::format("{:.1f}%", 100.0 * GetShare(bin.weight, result.weight))};
    AppendCategories(row, bin, codes);
    if (extent.nRates > 0)
        row.push_back(fmt::format("{:.1f}%", 100.0 * GetShare(bin.weights[1], bin.weight)));
    if (extent.nRates > 1)
        row.push_back(fmt::format("{:+.3f}", GetWeightOfEvidence(bin, categoryWeights)));
    if (extent.nRates > 2)
        row.push_back(fmt::format("{:.4f}", GetInformationValue(bin, categoryWeights)));
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

Rows MakeRows(const Findings& findings, const Result& result, const Extent& extent)
{
    const std::vector<double> categoryWeights = GetCategoryWeights(result);
    const std::vector<std::size_t> codes = GetHeaviest(categoryWeights, extent.nCategories);
    Rows rows{MakeHead(findings, result, codes, extent)};
    for (const Bin& bin : result.bins) rows.push_back(MakeRow(findings, result, bin, categoryWeights, codes, extent));
    return rows;
}

/// How many columns are left beside the rows, or nothing if they are too wide.
std::optional<std::size_t> GetRoom(const Rows& rows, const Screen& screen)
{
    constexpr std::size_t kEndless = 1000;
    const std::size_t width = screen.width.value_or(kEndless);
    const std::size_t taken = GetWidth(Align(rows.front(), GetWidths(rows)));
    return taken > width && screen.width ? std::nullopt : std::optional(width - std::min(width, taken));
}

} // namespace

void PrintBinTable(std::ostream& os, const Findings& findings, const Result& result, const Screen& screen)
{
    constexpr std::size_t kGap = 2; // in front of the bar
    Extent extent = MakeWidest(findings, result, screen);
    Rows rows = MakeRows(findings, result, extent);
    const auto fits = [&]
    {
        const std::optional<std::size_t> room = GetRoom(rows, screen);
        return room && (!extent.hasBar || *room >= kGap + kNarrowestBar);
    };
    while (!fits() && Narrow(extent)) rows = MakeRows(findings, result, extent);

    const std::size_t room = GetRoom(rows, screen).value_or(0);
    const std::vector<std::size_t> widths = GetWidths(rows);
    const ShareBar bar(findings, result, extent.hasBar ? std::min(room - kGap, kWidestBar) : 0, screen.hasColours);
    os << Align(rows.front(), widths) << '\n';
    for (std::size_t i = 0; i < result.bins.size(); ++i)
        os << Align(rows[i + 1], widths) << bar.Draw(result.bins[i]) << '\n';
    os << bar.GetLegend();
    if (extent.nRates > 0)
        os << "  rate and WoE of " << Quote(findings.FindTarget(result)->categories[1]) << "; information value "
           << fmt::format("{:.4f}", GetInformationValue(result)) << '\n';
}
