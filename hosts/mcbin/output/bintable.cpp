#include "hosts/mcbin/output/bintable.h"

#include "bins/numbers.h"
#include "bins/rows.h"
#include "bins/utf8.h"
#include "hosts/mcbin/output/columns.h"
#include "hosts/mcbin/output/describe.h"
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

constexpr std::size_t kWidestBar = 30;
constexpr std::size_t kNarrowestBar = 10;
constexpr std::size_t kWidestLabel = 60;
/// How many categories have a column each at most, however wide the screen.
constexpr std::size_t kMostCategoryColumns = 12;

/// What a table shows beside the bin, its weight and its share.
struct Extent
{
    std::size_t numCategories; ///< how many have a column of their own; the others share one, unless this is 0
    std::size_t numRates;      ///< how many of rate, weight of evidence and information value, in this order
    bool hasBar;
    std::size_t labelWidth; ///< a set of categories is cut off at it
};

/// The bins, and what is said of them in every table, however wide it is.
struct Content
{
    explicit Content(const AttributeBins& attributeBins) : bins(attributeBins), rows(MakeRows(bins)) {}

    const AttributeBins& bins;
    std::vector<BinRow> rows; ///< with evidence if the target has two categories
};

Extent MakeWidest(const Content& content, const Screen& screen)
{
    constexpr std::size_t kNumRates = 3;
    const Variable* const target = content.bins.target.get();
    return {std::min(kMostCategoryColumns, target ? target->categories.size() : 0),
            content.rows.front().evidence ? kNumRates : 0, true,
            std::min(kWidestLabel, screen.width.value_or(2 * kWidestLabel) / 2)};
}

/// Gives up what is missed least: the column of the lightest of many categories, or the bar, as the rate repeats it.
/// \return false if there is nothing more to give up.
bool Narrow(Extent& extent)
{
    if (extent.numCategories > 1 && extent.numRates == 0)
        --extent.numCategories;
    else if (extent.hasBar)
        extent.hasBar = false;
    else if (extent.numCategories > 0)
        extent.numCategories = 0;
    else if (extent.numRates > 0)
        --extent.numRates;
    else
        return false;
    return true;
}

std::vector<std::string> MakeHead(const AttributeBins& bins, const std::vector<std::size_t>& codes,
                                  const Extent& extent)
{
    const std::vector<std::string> rates{"rate", "WoE", "IV"};
    std::vector<std::string> head{"bin", "weight", "share"};
    for (const std::size_t code : codes) head.push_back(Printable(Shorten(bins.target->categories[code])));
    if (!codes.empty() && codes.size() < bins.target->categories.size())
        head.emplace_back("others");
    head.insert(head.end(), rates.begin(), rates.begin() + static_cast<std::ptrdiff_t>(extent.numRates));
    return head;
}

/// The interval, or as many of the bin's categories as have room.
std::string MakeLabel(const Content& content, std::size_t index, std::size_t width)
{
    std::string label = Printable(content.rows[index].label);
    if (content.rows[index].kind != BinRow::Kind::kBin)
        return label;
    std::vector<std::string> categories = ListCategories(content.bins, index);
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

std::vector<std::string> MakeCells(const Content& content, std::size_t index, const std::vector<std::size_t>& codes,
                                   const Extent& extent)
{
    const BinRow& row = content.rows[index];
    std::vector<std::string> cells{MakeLabel(content, index, extent.labelWidth), FormatWeight(row.bin.weight),
                                   fmt::format("{:.1f}%", 100.0 * row.share)};
    AppendCategories(cells, row.bin, codes);
    if (extent.numRates > 0)
        cells.push_back(fmt::format("{:.1f}%", 100.0 * row.evidence->rate));
    if (extent.numRates > 1)
        cells.push_back(FormatWeightOfEvidence(row, *row.evidence));
    if (extent.numRates > 2)
        cells.push_back(fmt::format("{:.4f}", row.evidence->informationValue));
    return cells;
}

/// Under the categories of a target of more than two the information value of each against all others.
/// Empty where there is none, or no category has a column.
std::vector<std::string> MakeInformationValues(const BinRow& total, std::size_t numColumns)
{
    const std::vector<std::size_t> codes = FindHeaviest(total.bin.weights, numColumns);
    if (codes.empty() || total.evidenceByCategory.empty())
        return {};
    std::vector<std::string> cells{"IV", "", ""};
    for (const std::size_t code : codes)
    {
        const std::optional<Evidence>& evidence = total.evidenceByCategory[code];
        cells.push_back(evidence ? fmt::format("{:.4f}", evidence->informationValue) : "");
    }
    if (codes.size() < total.evidenceByCategory.size())
        cells.emplace_back("-");
    return cells;
}

Rows MakeCells(const Content& content, const Extent& extent)
{
    const std::vector<std::size_t> codes = FindHeaviest(content.rows.back().bin.weights, extent.numCategories);
    Rows rows{MakeHead(content.bins, codes, extent)};
    for (std::size_t i = 0; i < content.rows.size(); ++i) rows.push_back(MakeCells(content, i, codes, extent));
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

constexpr std::size_t kGap = 2; // in front of the bar

/// Narrows the extent until the rows fit the screen.
Rows FitRows(const Content& content, const Screen& screen, Extent& extent)
{
    const auto fits = [&](const Rows& rows)
    {
        const std::optional<std::size_t> room = GetRoom(rows, screen);
        return room && (!extent.hasBar || *room >= kGap + kNarrowestBar);
    };
    Rows rows = MakeCells(content, extent);
    while (!fits(rows) && Narrow(extent)) rows = MakeCells(content, extent);
    const std::vector<std::string> values = MakeInformationValues(content.rows.back(), extent.numCategories);
    if (values.empty())
        return rows;
    Rows withValues = rows;
    withValues.push_back(values);
    return fits(withValues) ? withValues : rows;
}

/// What there is to say of the evidence that is shown.
void PrintNotes(std::ostream& os, const AttributeBins& bins, const Extent& extent, bool hasValues)
{
    if (extent.numRates > 0)
        os << "  " << DescribeEvidence(bins) << '\n';
    if (const std::string words = DescribeSmoothing(bins); (extent.numRates > 1 || hasValues) && !words.empty())
        os << "  " << words << '\n';
}

} // namespace

void PrintBinTable(std::ostream& os, const AttributeBins& bins, const Screen& screen)
{
    const Content content(bins);
    Extent extent = MakeWidest(content, screen);
    const Rows rows = FitRows(content, screen, extent);
    const std::size_t room = GetRoom(rows, screen).value_or(0);
    const std::vector<std::size_t> widths = GetWidths(rows);
    const ShareBar bar(bins, extent.hasBar ? std::min(room - kGap, kWidestBar) : 0, screen.hasColours);
    os << Align(rows.front(), widths) << '\n';
    for (std::size_t i = 1; i < rows.size(); ++i)
    {
        const bool hasBar = i < content.rows.size(); // neither the total nor what stands below it
        os << Align(rows[i], widths) << (hasBar ? bar.Draw(content.rows[i - 1].bin) : "") << '\n';
    }
    os << bar.GetLegend();
    PrintNotes(os, bins, extent, rows.size() > content.rows.size() + 1);
}
