#include "hosts/mcbin/output/sharebar.h"

#include "bins/labels.h"
#include "bins/rows.h"
#include "hosts/mcbin/output/describe.h"
#include "hosts/mcbin/text.h"

#include <algorithm>
#include <array>
#include <cmath>

namespace
{

constexpr std::array<const char*, 4> kShades{"█", "▓", "▒", "░"};
/// Blue, yellow, magenta and grey, which most colour-blind people can tell apart.
constexpr std::array<const char*, 4> kColours{"\x1b[34m", "\x1b[33m", "\x1b[35m", "\x1b[90m"};

double GetLargestWeight(const AttributeBins& bins)
{
    double largest = 0.0;
    for (const BinRow& row : MakeRows(bins))
    {
        if (row.kind != BinRow::Kind::kTotal)
            largest = std::max(largest, row.bin.weight);
    }
    return largest;
}

} // namespace

ShareBar::ShareBar(const AttributeBins& bins, std::size_t width, bool hasColours)
    : fBins(bins), fWidth(width), fHasColours(hasColours)
{
    const std::vector<double> weights = SumByCategory(bins);
    fHasOthers = weights.size() > kShades.size();
    fCodes = FindHeaviest(weights, fHasOthers ? kShades.size() - 1 : kShades.size());
}

std::string ShareBar::Draw(const Bin& bin) const
{
    if (fWidth == 0)
        return "";
    // Each part ends at the rounded sum of the shares up to it, so that all together are as wide as the bar.
    std::string bar = "  ";
    double sum = 0.0;
    std::size_t drawn = 0;
    const std::vector<double> parts = GetParts(bin);
    for (std::size_t i = 0; i < parts.size(); ++i)
    {
        sum += parts[i];
        const auto end = static_cast<std::size_t>(std::lround(sum * static_cast<double>(fWidth)));
        bar += Mark(i, end - drawn);
        drawn = end;
    }
    return bar;
}

std::string ShareBar::GetLegend() const
{
    const Variable* const target = fBins.target.get();
    if (!target || fWidth == 0)
        return "";
    std::string legend = " ";
    for (std::size_t i = 0; i < fCodes.size(); ++i)
        legend += " " + Mark(i, 1) + " " + Printable(Shorten(target->categories[fCodes[i]]));
    if (fHasOthers)
        legend += " " + Mark(fCodes.size(), 1) + " others";
    return legend + "\n";
}

/// The part of each shade in the bar.
std::vector<double> ShareBar::GetParts(const Bin& bin) const
{
    if (bin.weights.empty())
        return {ComputeShare(bin.weight, GetLargestWeight(fBins))};
    std::vector<double> parts;
    double others = bin.weight;
    for (const std::size_t code : fCodes)
    {
        parts.push_back(ComputeShare(bin.weights[code], bin.weight));
        others -= bin.weights[code];
    }
    if (fHasOthers)
        parts.push_back(ComputeShare(std::max(0.0, others), bin.weight));
    return parts;
}

std::string ShareBar::Mark(std::size_t part, std::size_t length) const
{
    std::string mark;
    for (std::size_t i = 0; i < length; ++i) mark += fHasColours ? kShades[0] : kShades[part];
    return fHasColours && length > 0 ? kColours[part] + mark + "\x1b[0m" : mark;
}
