#include "hosts/mcbin/output/evaluationpage.h"

#include "bins/evaluation.h"
#include "bins/measures.h"
#include "bins/numbers.h"
#include "hosts/mcbin/output/describe.h"
#include "hosts/mcbin/output/evaluationchart.h"
#include "hosts/mcbin/output/page.h"
#include "hosts/mcbin/text.h"

#include <fmt/format.h>

#include <ostream>
#include <string>
#include <vector>

namespace
{

std::string FormatCell(const std::optional<double>& figure)
{
    return "<td>" + (figure ? fmt::format("{:.4f}", *figure) : "") + "</td>";
}

std::string FormatPercent(double share)
{
    return fmt::format("<td>{:.1f}%</td>", 100.0 * share);
}

double ComputeMissingShare(const AttributeBins& bins)
{
    return ComputeShare(bins.weightWithMissing - bins.weight, bins.weightWithMissing);
}

std::string JoinFlags(const Evaluation& evaluation, std::size_t index)
{
    return EscapeHtml(Join(FindFlags(evaluation, index), "; "));
}

void PrintOverview(std::ostream& os, const Evaluation& evaluation)
{
    os << "<div class=\"scroll\"><table id=\"overview\">\n<tr><th></th><th>PSI</th><th></th><th>gain</th><th>now</th>"
          "<th>IV</th><th>now</th><th>missing</th><th>now</th></tr>\n";
    for (std::size_t i = 0; i < evaluation.second.results.size(); ++i)
    {
        const AttributeBins& first = evaluation.GetFirst(i);
        const AttributeBins& second = evaluation.GetSecond(i);
        os << "<tr><td><a href=\"#a" << i + 1 << "\">" << MakeHtmlHeading(first) << "</a></td>"
           << FormatCell(ComputeStability(evaluation, i)) << "<td class=\"flag\">" << JoinFlags(evaluation, i)
           << "</td>" << FormatCell(ComputeGain(first)) << FormatCell(ComputeGain(second))
           << FormatCell(ComputeInformationValue(first)) << FormatCell(ComputeInformationValue(second))
           << FormatPercent(ComputeMissingShare(first)) << FormatPercent(ComputeMissingShare(second)) << "</tr>\n";
    }
    os << "</table></div>\n";
}

void PrintPopulation(std::ostream& os, const BinRow& row)
{
    os << "<td>" << FormatWeight(row.bin.weight) << "</td>" << FormatPercent(row.share);
    if (!row.evidence || row.bin.weight == 0.0)
        return void(os << "<td></td><td></td>");
    os << FormatPercent(row.evidence->rate) << "<td>"
       << (row.kind == BinRow::Kind::kUnseen ? "" : FormatWeightOfEvidence(row, *row.evidence)) << "</td>";
}

void PrintRows(std::ostream& os, const std::vector<EvaluationRow>& rows)
{
    os << "<div class=\"scroll\"><table class=\"bins\">\n<tr><th></th><th></th><th colspan=\"4\">then</th>"
          "<th colspan=\"4\">now</th><th></th></tr>\n<tr><th>no.</th><th>bin</th>";
    for (int i = 0; i < 2; ++i) os << "<th>weight</th><th>share</th><th>rate</th><th>WoE</th>";
    os << "<th>PSI</th></tr>\n";
    for (std::size_t i = 0; i < rows.size(); ++i)
    {
        const bool isBin = rows[i].second.kind == BinRow::Kind::kBin;
        os << "<tr><td>" << (isBin ? std::to_string(i) : "") << "</td><td>" << EscapeHtml(rows[i].second.label)
           << "</td>";
        PrintPopulation(os, rows[i].first);
        PrintPopulation(os, rows[i].second);
        os << FormatCell(rows[i].stability) << "</tr>\n";
    }
    os << "</table></div>\n";
}

void PrintAttribute(std::ostream& os, const Evaluation& evaluation, std::size_t index)
{
    const AttributeBins& first = evaluation.GetFirst(index);
    const std::vector<EvaluationRow> rows = MakeRows(evaluation, index);
    os << "<section id=\"a" << index + 1 << "\">\n<h2>" << MakeHtmlHeading(first) << "</h2>\n<p>"
       << EscapeHtml(DescribeValues(evaluation.GetSecond(index))) << ".";
    for (const std::string& words : DescribeStrangers(evaluation, index)) os << ' ' << EscapeHtml(words) << '.';
    os << " <span class=\"flag\">" << JoinFlags(evaluation, index) << "</span></p>\n";
    PrintChart(os, rows, "Bins of " + first.attribute->name + " in both populations");
    PrintRows(os, rows);
    os << "</section>\n";
}

} // namespace

void PrintHtml(std::ostream& os, const Evaluation& evaluation)
{
    BeginPage(os, "Bins of " + MakeDataTitle(evaluation.first) + " in " + MakeDataTitle(evaluation.second));
    os << "<p>Then: " << evaluation.first.numRecords.value_or(0)
       << " records of which the bins were made. Now: " << evaluation.second.numRecords.value_or(0)
       << " records that were counted in them.";
    if (evaluation.weightOfUnseenTargets > 0.0)
    {
        os << " <span class=\"flag\">Left out: weight " << FormatWeight(evaluation.weightOfUnseenTargets)
           << " with a category of the target that the bins do not know.</span>";
    }
    os << "</p>\n";
    PrintOverview(os, evaluation);
    for (std::size_t i = 0; i < evaluation.second.results.size(); ++i) PrintAttribute(os, evaluation, i);
    EndPage(os);
}
