#include "hosts/mcbin/output/svgchart.h"

#include "bins/numbers.h"
#include "bins/rows.h"
#include "hosts/mcbin/output/describe.h"
#include "hosts/mcbin/text.h"

#include <fmt/format.h>

#include <algorithm>
#include <ostream>
#include <string>
#include <vector>

namespace
{

// Lengths in units of the picture, which is scaled to the width of the page or of a telephone.
constexpr double kWidth = 480.0;
constexpr double kLeft = 44.0;
constexpr double kRight = 8.0;
constexpr double kTop = 8.0;
constexpr double kStackHeight = 150.0;
constexpr double kGap = 10.0; ///< between the stacks and the weights
constexpr double kWeightHeight = 56.0;
constexpr double kLabelHeight = 22.0;
constexpr double kLabelWidth = 52.0; ///< room for one cut point
constexpr double kMissingGap = 0.5;  ///< in front of the missing, in widths of a bin
constexpr std::size_t kNumColours = 7;
constexpr std::size_t kOthersColour = 7;

/// Where things stand in one chart.
struct Layout
{
    double binWidth;
    double stackHeight; ///< 0 without a target
    double weightTop;
    double height;
};

Layout MakeLayout(const AttributeBins& bins)
{
    Layout layout{};
    const double numColumns = static_cast<double>(bins.bins.size()) + (HasMissing(bins) ? 1.0 + kMissingGap : 0.0);
    layout.binWidth = (kWidth - kLeft - kRight) / numColumns;
    layout.stackHeight = !bins.target ? 0.0 : kStackHeight;
    layout.weightTop = kTop + layout.stackHeight + (!bins.target ? 0.0 : kGap);
    layout.height = layout.weightTop + kWeightHeight + kLabelHeight;
    return layout;
}

/// The colour of each category, by code: the heaviest have one each, and all others share one.
std::vector<std::size_t> ChooseColours(const AttributeBins& bins)
{
    const std::vector<double> weights = SumByCategory(bins);
    const std::vector<std::size_t> codes = FindHeaviest(weights, kNumColours);
    std::vector<std::size_t> colours(weights.size(), kOthersColour);
    for (std::size_t i = 0; i < codes.size(); ++i) colours[codes[i]] = i;
    return colours;
}

void PrintKey(std::ostream& os, const Variable& target, const std::vector<std::size_t>& colours)
{
    os << "<ul class=\"key\">";
    for (std::size_t i = 0; i < colours.size(); ++i)
    {
        if (colours[i] != kOthersColour)
            os << "<li><i class=\"c" << colours[i] << "\"></i>" << EscapeHtml(target.categories[i]) << "</li>";
    }
    if (colours.size() > kNumColours)
        os << "<li><i class=\"c" << kOthersColour << "\"></i>others</li>";
    os << "</ul>\n";
}

void PrintRectangle(std::ostream& os, const std::string& kind, double x, double y, double width, double height,
                    const std::string& title)
{
    os << fmt::format("<rect class=\"{}\" x=\"{:.2f}\" y=\"{:.2f}\" width=\"{:.2f}\" height=\"{:.2f}\"><title>{}"
                      "</title></rect>\n",
                      kind, x, y, width, height, EscapeHtml(title));
}

void PrintText(std::ostream& os, double x, double y, const char* anchor, const std::string& text)
{
    os << fmt::format("<text x=\"{:.2f}\" y=\"{:.2f}\" text-anchor=\"{}\">{}</text>\n", x, y, anchor, EscapeHtml(text));
}

void PrintLine(std::ostream& os, double y)
{
    os << fmt::format("<line class=\"axis\" x1=\"{:.2f}\" y1=\"{:.2f}\" x2=\"{:.2f}\" y2=\"{:.2f}\"/>\n", kLeft, y,
                      kWidth - kRight, y);
}

void PrintAxes(std::ostream& os, const Layout& layout, double heaviest)
{
    if (layout.stackHeight > 0.0)
    {
        for (const int percent : {0, 50, 100})
        {
            const double y = kTop + layout.stackHeight * (1.0 - percent / 100.0);
            PrintLine(os, y);
            PrintText(os, kLeft - 5.0, y + 4.0, "end", fmt::format("{}%", percent));
        }
    }
    PrintLine(os, layout.weightTop + kWeightHeight);
    PrintText(os, kLeft - 5.0, layout.weightTop + 10.0, "end", fmt::format("{:.4g}", heaviest));
    PrintText(os, kLeft - 5.0, layout.weightTop + kWeightHeight + 2.0, "end", "0");
}

void PrintStack(std::ostream& os, const Variable& target, const Bin& bin, const std::string& label,
                const Layout& layout, double x, const std::vector<std::size_t>& colours)
{
    double bottom = kTop + layout.stackHeight;
    for (std::size_t i = 0; i < bin.weights.size(); ++i)
    {
        const double share = ComputeShare(bin.weights[i], bin.weight);
        if (share <= 0.0)
            continue;
        const double height = share * layout.stackHeight;
        bottom -= height;
        PrintRectangle(os, "c" + std::to_string(colours[i]), x, bottom, layout.binWidth - 1.0, height,
                       fmt::format("{}: {} {}, {:.1f}%", label, target.categories[i], FormatWeight(bin.weights[i]),
                                   100.0 * share));
    }
}

/// The cut points under the borders of the bins, as many as have room.
void PrintCutPoints(std::ostream& os, const AttributeBins& bins, const Layout& layout)
{
    if (bins.attribute->IsCategorical())
        return; // a code tells nobody anything
    double free = 0.0;
    for (std::size_t i = 0; i < bins.cutPoints.size(); ++i)
    {
        const double x = kLeft + layout.binWidth * static_cast<double>(i + 1) - 0.5;
        if (x - kLabelWidth / 2 < free)
            continue;
        PrintText(os, x, layout.height - 7.0, "middle", fmt::format("{:.6g}", bins.cutPoints[i]));
        free = x + kLabelWidth / 2;
    }
}

} // namespace

void PrintChart(std::ostream& os, const AttributeBins& bins)
{
    const Layout layout = MakeLayout(bins);
    const std::vector<std::size_t> colours = ChooseColours(bins);
    std::vector<BinRow> rows = MakeRows(bins);
    rows.pop_back(); // the total
    double heaviest = 0.0;
    for (const BinRow& row : rows) heaviest = std::max(heaviest, row.bin.weight);

    if (const Variable* const target = bins.target.get())
        PrintKey(os, *target, colours);
    os << fmt::format("<svg viewBox=\"0 0 {:.0f} {:.0f}\" role=\"img\" aria-label=\"Bins of {}\">\n", kWidth,
                      layout.height, EscapeHtml(bins.attribute->name));
    PrintAxes(os, layout, heaviest);
    double x = kLeft;
    for (const BinRow& row : rows)
    {
        const Bin& bin = row.bin;
        if (row.kind == BinRow::Kind::kMissing)
        {
            x += kMissingGap * layout.binWidth;
            PrintText(os, x + layout.binWidth / 2, layout.height - 7.0, "middle", row.label);
        }
        if (bins.target)
            PrintStack(os, *bins.target, bin, row.label, layout, x, colours);
        const double height = kWeightHeight * ComputeShare(bin.weight, heaviest);
        PrintRectangle(os, "weight", x, layout.weightTop + kWeightHeight - height, layout.binWidth - 1.0, height,
                       fmt::format("{}: weight {}, {:.1f}%", row.label, FormatWeight(bin.weight), 100.0 * row.share));
        x += layout.binWidth;
    }
    PrintCutPoints(os, bins, layout);
    os << "</svg>\n";
}
