#include "hosts/mcbin/output/htmlreport.h"

#include "bins/numbers.h"
#include "bins/words.h"
#include "hosts/mcbin/figures.h"
#include "hosts/mcbin/findings.h"
#include "hosts/mcbin/output/pagestyle.h"
#include "hosts/mcbin/output/svgchart.h"
#include "hosts/mcbin/text.h"

#include <fmt/format.h>

#include <filesystem>
#include <ostream>
#include <string>
#include <vector>

namespace
{

bool HasTarget(const Findings& findings)
{
    return findings.settings.method == Method::kSupervised;
}

std::string GetHeading(const Findings& findings, const Result& result)
{
    const Variable* const target = findings.FindTarget(result);
    const std::string name = EscapeHtml(findings.GetAttribute(result).name);
    return target ? name + " <small>by " + EscapeHtml(target->name) + "</small>" : name;
}

std::string FormatMissing(const Result& result)
{
    return FormatWeight(result.weightWithMissing - result.weight);
}

/// Of a file: its name without the directories.
std::string GetTitle(const Findings& findings)
{
    return "Bins of " + EscapeHtml(std::filesystem::path(findings.dataName).filename().string());
}

void PrintTitle(std::ostream& os, const Findings& findings)
{
    const bool isSupervised = HasTarget(findings);
    os << "<h1>" << GetTitle(findings) << "</h1>\n<p>"
       << (isSupervised ? "Cut where the categories of the target are separated best"
                        : "Cut into bins of about equal weight")
       << "; bins hold their " << (findings.settings.isRightClosed ? "right" : "left") << " border.";
    if (findings.records)
        os << ' ' << *findings.records << " records.";
    os << " Made by " << EscapeHtml(findings.componentVersion) << ".</p>\n";
}

void PrintOverviewRow(std::ostream& os, const Findings& findings, const Result& result, std::size_t rank)
{
    os << "<tr><td><a href=\"#a" << rank << "\">" << GetHeading(findings, result) << "</a></td>";
    if (HasTarget(findings))
    {
        const double share = GetShare(GetGain(result), result.targetEntropy.value_or(0.0));
        os << fmt::format("<td>{:.4f}</td><td class=\"meter\"><span style=\"width:{:.1f}%\"></span>{:.1f}%</td>",
                          GetGain(result), 100.0 * share, 100.0 * share);
    }
    os << "<td>" << result.bins.size() << "</td><td>" << result.distinctValues << "</td><td>" << FormatMissing(result)
       << "</td></tr>\n";
}

void PrintOverview(std::ostream& os, const Findings& findings, const std::vector<const Result*>& results)
{
    if (results.empty())
        return;
    os << "<div class=\"scroll\"><table id=\"overview\">\n<tr><th>attribute</th>"
       << (HasTarget(findings) ? "<th>gain, bits</th><th>of the entropy</th>" : "")
       << "<th>bins</th><th>distinct</th><th>missing</th></tr>\n";
    for (std::size_t i = 0; i < results.size(); ++i) PrintOverviewRow(os, findings, *results[i], i + 1);
    os << "</table></div>\n";
}

void PrintBinsHead(std::ostream& os, const Findings& findings, const Result& result)
{
    os << "<tr><th>bin</th><th>weight</th><th>share</th>";
    if (const Variable* const target = findings.FindTarget(result))
        for (const std::string& category : target->categories) os << "<th>" << EscapeHtml(category) << "</th>";
    os << (HasTwoCategories(findings, result) ? "<th>rate</th><th>WoE</th><th>IV</th>" : "") << "</tr>\n";
}

void PrintBinRow(std::ostream& os, const Findings& findings, const Result& result, const Bin& bin,
                 const std::vector<double>& categoryWeights)
{
    os << "<tr><td>" << EscapeHtml(FormatBin(findings, result, bin)) << "</td><td>" << FormatWeight(bin.weight)
       << fmt::format("</td><td>{:.1f}%</td>", 100.0 * GetShare(bin.weight, result.weight));
    for (const double weight : bin.weights) os << "<td>" << FormatWeight(weight) << "</td>";
    if (HasTwoCategories(findings, result))
        os << fmt::format("<td>{:.1f}%</td><td>{:+.3f}</td><td>{:.4f}</td>",
                          100.0 * GetShare(bin.weights[1], bin.weight), GetWeightOfEvidence(bin, categoryWeights),
                          GetInformationValue(bin, categoryWeights));
    os << "</tr>\n";
}

void PrintBins(std::ostream& os, const Findings& findings, const Result& result)
{
    const std::vector<double> categoryWeights = GetCategoryWeights(result);
    os << "<div class=\"scroll\"><table class=\"bins\">\n";
    PrintBinsHead(os, findings, result);
    for (const Bin& bin : result.bins) PrintBinRow(os, findings, result, bin, categoryWeights);
    os << "</table></div>\n";
}

void PrintFigures(std::ostream& os, const Findings& findings, const Result& result)
{
    os << "<p>";
    if (result.targetEntropy && result.modelEntropy)
        os << fmt::format("Gain {:.4f} bits: entropy ", GetGain(result)) << FormatNumber(*result.targetEntropy)
           << " before, " << FormatNumber(*result.modelEntropy) << " after. ";
    os << EscapeHtml(DescribeValues(findings, result)) << ", missing weight " << FormatMissing(result) << '.';
    if (!result.status.IsOK())
        os << ' ' << EscapeHtml(DescribeStatus(result.status)) << '.';
    os << "</p>\n";
}

void PrintAttribute(std::ostream& os, const Findings& findings, const Result& result, std::size_t rank)
{
    os << "<section id=\"a" << rank << "\">\n<h2>" << GetHeading(findings, result) << "</h2>\n";
    PrintFigures(os, findings, result);
    PrintChart(os, findings, result);
    PrintBins(os, findings, result);
    os << "</section>\n";
}

void PrintUncut(std::ostream& os, const Findings& findings)
{
    const std::vector<const Result*> uncut = GetUncut(findings);
    if (!uncut.empty())
    {
        os << "<h2>Without cut points</h2>\n<ul>\n";
        for (const Result* const result : uncut)
            os << "<li>" << GetHeading(findings, *result) << ": " << EscapeHtml(DescribeStatus(result->status))
               << "</li>\n";
        os << "</ul>\n";
    }
    if (const std::string words = DescribeWithoutWeight(findings); !words.empty())
        os << "<p>Left out, as they have no weight: " << words << "</p>\n";
    if (!findings.leftOut.empty())
        os << "<p>Left out, as they hold text: " << EscapeHtml(Join(findings.leftOut, ", ")) << "</p>\n";
}

} // namespace

void PrintHtml(std::ostream& os, const Findings& findings)
{
    os << "<!DOCTYPE html>\n<html lang=\"en\">\n<head>\n<meta charset=\"utf-8\">\n"
          "<meta name=\"viewport\" content=\"width=device-width, initial-scale=1\">\n"
          "<meta name=\"color-scheme\" content=\"light dark\">\n<title>"
       << GetTitle(findings) << "</title>\n<style>" << kPageStyle << "</style>\n</head>\n<body>\n";
    PrintTitle(os, findings);
    const std::vector<const Result*> results = SortByGain(findings);
    PrintOverview(os, findings, results);
    for (std::size_t i = 0; i < results.size(); ++i) PrintAttribute(os, findings, *results[i], i + 1);
    PrintUncut(os, findings);
    os << "</body>\n</html>\n";
}
