#include "hosts/mcbin/output/evaluationchart.h"

#include "hosts/mcbin/output/svg.h"
#include "hosts/mcbin/text.h"

#include <fmt/format.h>

#include <algorithm>
#include <ostream>

namespace
{

// Lengths in units of the picture.
constexpr double kWidth = 480.0;
constexpr double kLeft = 48.0;
constexpr double kRight = 44.0;
constexpr double kTop = 8.0;
constexpr double kHeight = 130.0; ///< of what is drawn
constexpr double kLabelHeight = 20.0;
constexpr double kBarsShare = 0.8; ///< of the width of a row

/// One of the two populations.
struct Population
{
    BinRow EvaluationRow::*row;
    const char* kind; ///< the class of its shapes
    const char* name;
};

constexpr Population kPopulations[] = {{&EvaluationRow::first, "first", "then"},
                                       {&EvaluationRow::second, "second", "now"}};

double FindLargest(const std::vector<EvaluationRow>& rows, double (*get)(const BinRow&))
{
    double largest = 0.0;
    for (std::size_t i = 0; i + 1 < rows.size(); ++i)
        largest = std::max({largest, get(rows[i].first), get(rows[i].second)});
    return largest > 0.0 ? largest : 1.0;
}

double GetShare(const BinRow& row)
{
    return row.share;
}

double GetRate(const BinRow& row)
{
    return row.evidence ? row.evidence->rate : 0.0;
}

void PrintBars(std::ostream& os, const std::vector<EvaluationRow>& rows, const Population& population, double offset,
               double rowWidth)
{
    const double largest = FindLargest(rows, GetShare);
    for (std::size_t i = 0; i + 1 < rows.size(); ++i)
    {
        const BinRow& row = rows[i].*population.row;
        const double height = kHeight * row.share / largest;
        const double x = kLeft + rowWidth * (static_cast<double>(i) + offset);
        PrintRectangle(os, population.kind, x, kTop + kHeight - height, rowWidth * kBarsShare / 2, height,
                       fmt::format("{}, {}: {:.1f}%", rows[i].second.label, population.name, 100.0 * row.share));
    }
}

void PrintRates(std::ostream& os, const std::vector<EvaluationRow>& rows, const Population& population, double rowWidth)
{
    const double largest = FindLargest(rows, GetRate);
    std::vector<Point> points;
    for (std::size_t i = 0; i + 1 < rows.size(); ++i)
    {
        const BinRow& row = rows[i].*population.row;
        if (row.kind != BinRow::Kind::kBin || !row.evidence)
            continue;
        const double x = kLeft + rowWidth * (static_cast<double>(i) + 0.5);
        points.push_back({x, kTop + kHeight * (1.0 - row.evidence->rate / largest),
                          fmt::format("{}, {}: rate {:.1f}%", row.label, population.name, 100.0 * row.evidence->rate)});
    }
    if (!points.empty())
        PrintCurve(os, population.kind, points);
}

} // namespace

void PrintChart(std::ostream& os, const std::vector<EvaluationRow>& rows, const std::string& title)
{
    const double rowWidth = (kWidth - kLeft - kRight) / static_cast<double>(rows.size() - 1);
    os << "<ul class=\"key\"><li><i style=\"background:var(--soft)\"></i>then</li>"
          "<li><i style=\"background:var(--c0)\"></i>now</li><li>bars: share of the weight; lines: rate</li></ul>\n";
    os << fmt::format("<svg viewBox=\"0 0 {:.0f} {:.0f}\" role=\"img\" aria-label=\"{}\">\n", kWidth,
                      kTop + kHeight + kLabelHeight, EscapeHtml(title));
    PrintAxis(os, kLeft, kWidth - kRight, kTop + kHeight);
    PrintText(os, kLeft - 5.0, kTop + 10.0, "end", fmt::format("{:.1f}%", 100.0 * FindLargest(rows, GetShare)));
    if (rows.back().first.evidence || rows.back().second.evidence)
    {
        PrintText(os, kWidth - kRight + 5.0, kTop + 10.0, "start",
                  fmt::format("{:.1f}%", 100.0 * FindLargest(rows, GetRate)));
    }
    double offset = (1.0 - kBarsShare) / 2;
    for (const Population& population : kPopulations)
    {
        PrintBars(os, rows, population, offset, rowWidth);
        offset += kBarsShare / 2;
    }
    for (const Population& population : kPopulations) PrintRates(os, rows, population, rowWidth);
    for (std::size_t i = 0; i + 1 < rows.size(); ++i)
    {
        const double x = kLeft + rowWidth * (static_cast<double>(i) + 0.5);
        const bool isBin = rows[i].second.kind == BinRow::Kind::kBin;
        PrintText(os, x, kTop + kHeight + 14.0, "middle", isBin ? std::to_string(i) : rows[i].second.label);
    }
    os << "</svg>\n";
}
