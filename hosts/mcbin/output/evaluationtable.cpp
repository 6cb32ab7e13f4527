#include "hosts/mcbin/output/evaluationtable.h"

#include "bins/evaluation.h"
#include "bins/measures.h"
#include "bins/numbers.h"
#include "bins/utf8.h"
#include "hosts/mcbin/output/columns.h"
#include "hosts/mcbin/output/describe.h"
#include "hosts/mcbin/text.h"

#include <fmt/format.h>

#include <algorithm>
#include <ostream>
#include <string>
#include <vector>

namespace
{

constexpr std::size_t kWidestLabel = 40;

/// How many pairs of columns there may be behind the shares: those of the rates, and of the weights of evidence.
std::size_t CountPairs(const std::vector<EvaluationRow>& rows)
{
    return rows.back().first.evidence || rows.back().second.evidence ? 2 : 0;
}

std::string FormatRate(const BinRow& row)
{
    return row.evidence && row.bin.weight > 0.0 ? fmt::format("{:.1f}%", 100.0 * row.evidence->rate) : "";
}

std::string FormatEvidence(const BinRow& row)
{
    const bool hasEvidence = row.evidence && row.kind != BinRow::Kind::kUnseen && row.bin.weight > 0.0;
    return hasEvidence ? FormatWeightOfEvidence(row, *row.evidence) : "";
}

std::vector<std::string> MakeCells(const EvaluationRow& row, std::size_t numPairs)
{
    std::vector<std::string> cells{Printable(Shorten(row.second.label, kWidestLabel)),
                                   row.stability ? fmt::format("{:.1f}%", 100.0 * row.first.share) : "",
                                   fmt::format("{:.1f}%", 100.0 * row.second.share),
                                   row.stability ? fmt::format("{:.4f}", *row.stability) : ""};
    if (numPairs > 0)
    {
        cells.push_back(FormatRate(row.first));
        cells.push_back(FormatRate(row.second));
    }
    if (numPairs > 1)
    {
        cells.push_back(FormatEvidence(row.first));
        cells.push_back(FormatEvidence(row.second));
    }
    return cells;
}

Rows MakeTable(const std::vector<EvaluationRow>& rows, std::size_t numPairs)
{
    const std::vector<std::string> head{"bin", "share", "now", "PSI", "rate", "now", "WoE", "now"};
    Rows cells{{head.begin(), head.begin() + static_cast<std::ptrdiff_t>(4 + 2 * numPairs)}};
    for (const EvaluationRow& row : rows) cells.push_back(MakeCells(row, numPairs));
    return cells;
}

/// A figure of both populations, as in "gain 0.2100 then, 0.1905 now", or of the second alone.
std::string FormatPair(const std::string& what, const std::optional<double>& first, const std::optional<double>& second)
{
    const std::string now = fmt::format("{:.4f}", *second);
    return first ? fmt::format("{} {:.4f} then, {} now", what, *first, now) : what + " " + now;
}

void PrintFigures(std::ostream& os, const AttributeBins& first, const AttributeBins& second)
{
    std::vector<std::string> figures;
    if (ComputeGain(second))
        figures.push_back(FormatPair("gain", ComputeGain(first), ComputeGain(second)));
    if (ComputeInformationValue(second))
        figures.push_back(FormatPair("IV", ComputeInformationValue(first), ComputeInformationValue(second)));
    if (!figures.empty())
        os << "  " << Join(figures, "; ") << '\n';
}

void PrintAttribute(std::ostream& os, const Evaluation& evaluation, std::size_t index, const Screen& screen)
{
    const AttributeBins& first = evaluation.GetFirst(index);
    const std::vector<EvaluationRow> rows = MakeRows(evaluation, index);
    const std::string heading = MakeHeading(first);
    os << (screen.hasColours ? "\x1b[1m" + heading + "\x1b[0m" : heading);
    if (rows.back().stability)
        os << fmt::format(": PSI {:.4f}", *rows.back().stability);
    os << '\n';
    PrintFigures(os, first, evaluation.GetSecond(index));
    std::size_t numPairs = CountPairs(rows);
    Rows cells = MakeTable(rows, numPairs);
    while (numPairs > 0 && screen.width && GetWidth(Align(cells.front(), GetWidths(cells))) > *screen.width)
        cells = MakeTable(rows, --numPairs);
    const std::vector<std::size_t> widths = GetWidths(cells);
    for (const std::vector<std::string>& row : cells) os << Align(row, widths) << '\n';
    for (const std::string& words : DescribeStrangers(evaluation, index)) os << "  " << Printable(words) << '\n';
    for (const std::string& flag : FindFlags(evaluation, index)) os << "  ! " << Printable(flag) << '\n';
    os << '\n';
}

} // namespace

void PrintTables(std::ostream& os, const Evaluation& evaluation, const Screen& screen)
{
    for (std::size_t i = 0; i < evaluation.second.results.size(); ++i) PrintAttribute(os, evaluation, i, screen);
    if (evaluation.weightOfUnseenTargets > 0.0)
    {
        os << "! records with a category of the target that the bins do not know: weight "
           << FormatWeight(evaluation.weightOfUnseenTargets) << '\n';
    }
    if (const std::string words = DescribeWithoutWeight(evaluation.second); !words.empty())
        os << "Left out, as they have no weight: " << words << '\n';
}
