#include "hosts/mcbin/output/svgchart.h"

#include "bins/numbers.h"
#include "bins/rows.h"
#include "hosts/mcbin/output/describe.h"
#include "hosts/mcbin/output/svg.h"
#include "hosts/mcbin/text.h"

#include <fmt/format.h>

#include <algorithm>
#include <cmath>
#include <ostream>
#include <string>
#include <vector>

namespace
{

// Lengths in units of the picture, which is scaled to the width of the page or of a telephone.
constexpr double kWidth = 480.0;
constexpr double kLeft = 44.0;
constexpr double kRight = 36.0; ///< room for the scale of the weights of evidence
constexpr double kEvidenceMargin = 4.0;
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

void PrintAxes(std::ostream& os, const Layout& layout, double heaviest)
{
    if (layout.stackHeight > 0.0)
    {
        for (const int percent : {0, 50, 100})
        {
            const double y = kTop + layout.stackHeight * (1.0 - percent / 100.0);
            PrintAxis(os, kLeft, kWidth - kRight, y);
            PrintText(os, kLeft - 5.0, y + 4.0, "end", fmt::format("{}%", percent));
        }
    }
    PrintAxis(os, kLeft, kWidth - kRight, layout.weightTop + kWeightHeight);
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

/// The weights of evidence as a line over the weights of the bins; its middle is 0.
void PrintWeightsOfEvidence(std::ostream& os, const std::vector<Point>& middles, const std::vector<BinRow>& rows,
                            const Layout& layout)
{
    double largest = 0.0;
    for (const BinRow& row : rows)
    {
        const double size = row.evidence ? std::fabs(row.evidence->weightOfEvidence) : 0.0;
        if (std::isfinite(size))
            largest = std::max(largest, size);
    }
    if (largest == 0.0)
        return;
    const double middle = layout.weightTop + kWeightHeight / 2;
    std::vector<Point> ofBins;
    std::vector<Point> ofOthers;
    for (std::size_t i = 0; i < rows.size(); ++i)
    {
        const double evidence = std::clamp(rows[i].evidence->weightOfEvidence, -largest, largest);
        const double y = middle - evidence / largest * (kWeightHeight / 2 - kEvidenceMargin);
        const std::string title =
            fmt::format("{}: WoE {}", rows[i].label, FormatWeightOfEvidence(rows[i], *rows[i].evidence));
        (rows[i].kind == BinRow::Kind::kBin ? ofBins : ofOthers).push_back({middles[i].x, y, title});
    }
    PrintCurve(os, "curve", ofBins);
    for (const Point& point : ofOthers) PrintCurve(os, "curve", {point});
    PrintText(os, kWidth - kRight + 3.0, middle - kWeightHeight / 2 + 10.0, "start", fmt::format("{:.2g}", largest));
    PrintText(os, kWidth - kRight + 3.0, middle + kWeightHeight / 2 + 2.0, "start", fmt::format("{:.2g}", -largest));
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
    std::vector<Point> middles;
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
        middles.push_back({x + layout.binWidth / 2, 0.0, ""});
        x += layout.binWidth;
    }
    if (rows.front().evidence)
        PrintWeightsOfEvidence(os, middles, rows, layout);
    PrintCutPoints(os, bins, layout);
    os << "</svg>\n";
}

void PrintSpark(std::ostream& os, const AttributeBins& bins)
{
    constexpr double kSparkWidth = 72.0;
    constexpr double kSparkHeight = 18.0;
    constexpr double kMargin = 2.0;
    std::vector<double> figures;
    for (const BinRow& row : MakeRows(bins))
    {
        if (row.kind == BinRow::Kind::kBin)
            figures.push_back(row.evidence ? row.evidence->rate : row.bin.weight);
    }
    const auto [least, largest] = std::minmax_element(figures.begin(), figures.end());
    const double range = *largest > *least ? *largest - *least : 1.0;
    const double step = (kSparkWidth - 2 * kMargin) / static_cast<double>(figures.size());
    std::vector<Point> points;
    for (std::size_t i = 0; i < figures.size(); ++i)
    {
        const double y = kSparkHeight - kMargin - (figures[i] - *least) / range * (kSparkHeight - 2 * kMargin);
        const double x = kMargin + step * static_cast<double>(i);
        points.push_back({x, y, ""}); // a step for each bin
        points.push_back({x + step, y, ""});
    }
    os << fmt::format("<svg class=\"spark\" viewBox=\"0 0 {:.0f} {:.0f}\" role=\"img\" aria-label=\"from bin to bin\">",
                      kSparkWidth, kSparkHeight);
    PrintCurve(os, "curve", points);
    os << "</svg>";
}
