#include "hosts/mcbin/output/htmlreport.h"

#include "bins/labels.h"
#include "bins/numbers.h"
#include "bins/rows.h"
#include "bins/words.h"
#include "hosts/mcbin/outcome.h"
#include "hosts/mcbin/output/describe.h"
#include "hosts/mcbin/output/page.h"
#include "hosts/mcbin/output/svgchart.h"
#include "hosts/mcbin/text.h"

#include <fmt/format.h>

#include <ostream>
#include <string>
#include <vector>

namespace
{

bool HasTarget(const Bins& bins)
{
    return bins.settings.method == Method::kSupervised;
}

std::string FormatMissing(const AttributeBins& bins)
{
    return FormatWeight(bins.weightWithMissing - bins.weight);
}

void PrintTitle(std::ostream& os, const Bins& bins)
{
    BeginPage(os, "Bins of " + MakeDataTitle(bins));
    os << "<p>"
       << (HasTarget(bins) ? "Cut where the categories of the target are separated best"
                           : "Cut into bins of about equal weight")
       << "; bins hold their " << (bins.settings.isRightClosed ? "right" : "left") << " border.";
    if (bins.numRecords)
        os << ' ' << *bins.numRecords << " records.";
    os << " Made by " << EscapeHtml(bins.componentVersion) << ".</p>\n";
}

void PrintOverviewRow(std::ostream& os, const AttributeBins& bins, bool hasTarget, std::size_t rank)
{
    os << "<tr><td><a href=\"#a" << rank << "\">" << MakeHtmlHeading(bins) << "</a></td>";
    if (hasTarget)
    {
        const double gain = ComputeGain(bins).value_or(0.0);
        const double share = ComputeShare(gain, ComputeTargetEntropy(bins).value_or(0.0));
        os << fmt::format("<td>{:.4f}</td><td class=\"meter\"><span style=\"width:{:.1f}%\"></span>{:.1f}%</td>", gain,
                          100.0 * share, 100.0 * share);
    }
    if (hasTarget)
    {
        const std::optional<double> value = ComputeInformationValue(bins);
        os << "<td>" << (value ? fmt::format("{:.4f}", *value) : "") << "</td>";
    }
    os << "<td>";
    PrintSpark(os, bins);
    os << "</td><td>" << bins.bins.size() << "</td><td>" << (bins.numDistinct ? std::to_string(*bins.numDistinct) : "")
       << fmt::format("</td><td>{:.1f}%</td></tr>\n",
                      100.0 * ComputeShare(bins.weightWithMissing - bins.weight, bins.weightWithMissing));
}

void PrintOverview(std::ostream& os, const std::vector<const AttributeBins*>& results, bool hasTarget)
{
    if (results.empty())
        return;
    os << "<div class=\"scroll\"><table id=\"overview\">\n<tr><th>attribute</th>"
       << (hasTarget ? "<th>gain, bits</th><th>of the entropy</th><th>IV</th>" : "")
       << "<th>by bin</th><th>bins</th><th>distinct</th><th>missing</th></tr>\n";
    for (std::size_t i = 0; i < results.size(); ++i) PrintOverviewRow(os, *results[i], hasTarget, i + 1);
    os << "</table></div>\n";
}

void PrintBinsHead(std::ostream& os, const AttributeBins& bins, bool hasEvidence)
{
    os << "<tr><th>bin</th><th>weight</th><th>share</th>";
    if (bins.target)
    {
        for (const std::string& category : bins.target->categories) os << "<th>" << EscapeHtml(category) << "</th>";
    }
    os << (hasEvidence ? "<th>rate</th><th>WoE</th><th>IV</th>" : "") << "</tr>\n";
}

void PrintLabel(std::ostream& os, const BinRow& row)
{
    os << (row.kind == BinRow::Kind::kBin ? "<tr>" : "<tr class=\"" + row.label + "\">") << "<td>"
       << EscapeHtml(row.label) << "</td>";
}

void PrintEvidence(std::ostream& os, const BinRow& row, const std::optional<Evidence>& evidence)
{
    if (evidence)
    {
        os << fmt::format("<td>{:.1f}%</td><td>{}</td><td>{:.4f}</td>", 100.0 * evidence->rate,
                          FormatWeightOfEvidence(row, *evidence), evidence->informationValue);
    }
}

void PrintRow(std::ostream& os, const BinRow& row)
{
    PrintLabel(os, row);
    os << "<td>" << FormatWeight(row.bin.weight) << fmt::format("</td><td>{:.1f}%</td>", 100.0 * row.share);
    for (const double weight : row.bin.weights) os << "<td>" << FormatWeight(weight) << "</td>";
    PrintEvidence(os, row, row.evidence);
    os << "</tr>\n";
}

/// Of a target of more than two categories, folded away.
void PrintEvidenceByCategory(std::ostream& os, const AttributeBins& bins, const std::vector<BinRow>& rows)
{
    os << "<details><summary>Each category against the rest</summary>\n<div class=\"scroll\"><table>\n<tr><th></th>";
    const std::vector<std::optional<Evidence>>& first = rows.front().evidenceByCategory;
    for (std::size_t code = 0; code < first.size(); ++code)
    {
        if (first[code])
            os << "<th colspan=\"3\">" << EscapeHtml(FormatCategory(*bins.target, code)) << "</th>";
    }
    os << "</tr>\n<tr><th>bin</th>";
    for (const std::optional<Evidence>& evidence : first)
        os << (evidence ? "<th>rate</th><th>WoE</th><th>IV</th>" : "");
    os << "</tr>\n";
    for (const BinRow& row : rows)
    {
        PrintLabel(os, row);
        for (const std::optional<Evidence>& evidence : row.evidenceByCategory) PrintEvidence(os, row, evidence);
        os << "</tr>\n";
    }
    os << "</table></div></details>\n";
}

void PrintBins(std::ostream& os, const AttributeBins& bins)
{
    const std::vector<BinRow> rows = MakeRows(bins);
    const bool hasEvidence = rows.front().evidence.has_value();
    os << "<div class=\"scroll\"><table class=\"bins\">\n";
    PrintBinsHead(os, bins, hasEvidence);
    for (const BinRow& row : rows) PrintRow(os, row);
    os << "</table></div>\n";
    if (const std::string evidence = DescribeEvidence(bins); !evidence.empty())
    {
        const std::string smoothing = DescribeSmoothing(bins);
        os << "<p class=\"note\">" << EscapeHtml(evidence) << (smoothing.empty() ? "" : "; ") << smoothing << ".</p>\n";
    }
    if (!rows.front().evidenceByCategory.empty())
        PrintEvidenceByCategory(os, bins, rows);
}

void PrintFigures(std::ostream& os, const AttributeBins& bins)
{
    os << "<p>";
    if (const std::optional<double> gain = ComputeGain(bins))
    {
        os << fmt::format("Gain {:.4f} bits: entropy {:.4f} before, {:.4f} after. ", *gain, *ComputeTargetEntropy(bins),
                          *bins.modelEntropy);
    }
    os << EscapeHtml(DescribeValues(bins)) << ", missing weight " << FormatMissing(bins) << '.';
    if (!bins.status.IsOK())
        os << ' ' << EscapeHtml(DescribeStatus(bins.status)) << '.';
    os << "</p>\n";
}

void PrintAttribute(std::ostream& os, const AttributeBins& bins, std::size_t rank)
{
    os << "<section id=\"a" << rank << "\">\n<h2>" << MakeHtmlHeading(bins) << "</h2>\n";
    PrintFigures(os, bins);
    PrintChart(os, bins);
    PrintBins(os, bins);
    os << "</section>\n";
}

void PrintUncut(std::ostream& os, const Outcome& outcome)
{
    const std::vector<const AttributeBins*> uncut = FindUncut(outcome.bins);
    if (!uncut.empty())
    {
        os << "<h2>Without cut points</h2>\n<ul>\n";
        for (const AttributeBins* const result : uncut)
            os << "<li>" << MakeHtmlHeading(*result) << ": " << EscapeHtml(DescribeStatus(result->status)) << "</li>\n";
        os << "</ul>\n";
    }
    if (const std::string words = DescribeWithoutWeight(outcome.bins); !words.empty())
        os << "<p>Left out, as they have no weight: " << words << "</p>\n";
    if (!outcome.leftOut.empty())
        os << "<p>Left out: " << EscapeHtml(Join(outcome.leftOut, ", ")) << "</p>\n";
}

} // namespace

void PrintHtml(std::ostream& os, const Outcome& outcome)
{
    PrintTitle(os, outcome.bins);
    const std::vector<const AttributeBins*> results = SortByGain(outcome.bins);
    PrintOverview(os, results, HasTarget(outcome.bins));
    for (std::size_t i = 0; i < results.size(); ++i) PrintAttribute(os, *results[i], i + 1);
    PrintUncut(os, outcome);
    EndPage(os);
}
