#include "report.h"

#include "numbers.h"
#include "statuswords.h"
#include "tableprofile.h"
#include "texttable.h"

#include <mcobnqrt/binattributeresults.h>
#include <mcobnqrt/binattributetargetresults.h>
#include <mcobnqrt/binstringencoder.h>
#include <mcobnqrt/binvarlist.h>

#include <cstddef>
#include <ostream>
#include <string>

namespace
{

std::string GetName(const BINVarList& list, int index)
{
    const IBINVariable* const variable = list.GetVarAt(index);
    return variable ? Printable(variable->GetVariableName()) : "?";
}

std::string GetInterval(const std::vector<double>& cutPoints, std::size_t bin)
{
    const std::string left = bin == 0 ? "-inf" : FormatNumber(cutPoints[bin - 1]);
    const std::string right = bin == cutPoints.size() ? "+inf)" : FormatNumber(cutPoints[bin]) + "]";
    return "(" + left + ", " + right;
}

std::string FormatFigure(double value)
{
    return value == MCMV::gMissingValue ? "none" : FormatNumber(value);
}

/// The beginning of a long text.
std::string Shorten(const std::string& text)
{
    constexpr std::size_t kLongest = 30;
    if (text.size() <= kLongest)
        return text;
    std::size_t size = kLongest;
    while (size > 0 && (static_cast<unsigned char>(text[size]) & 0xC0) == 0x80)
        --size; // not inside a code point of UTF-8
    return text.substr(0, size) + "...";
}

/// The head of a table of bins.
std::vector<std::string> MakeHead(const BINVarList& list, int target)
{
    std::vector<std::string> head{"bin", "weight"};
    // The tool's targets are of strings, each with the encoder of those.
    if (const auto* const encoder = static_cast<const BINStringEncoder*>(list.GetEncoderAt(target)))
        for (int code = 0; code < encoder->GetNumberOfCategories(); ++code)
            head.push_back(Printable(encoder->Decode(code)));
    return head;
}

void AppendWeights(std::vector<std::string>& row, double weight)
{
    row.push_back(FormatNumber(weight));
}

void AppendWeights(std::vector<std::string>& row, const std::vector<double>& weights)
{
    for (const double weight : weights) AppendWeights(row, weight);
}

/// Prints nothing if nothing was binned.
template<class Results>
void PrintBins(std::ostream& os, const Results& results, const std::vector<std::string>& head)
{
    std::vector<std::vector<std::string>> rows{head};
    for (const auto& weights : results.GetCellCounts())
    {
        std::vector<std::string> row{GetInterval(results.GetCutPoints(), rows.size() - 1)};
        AppendWeights(row, weights);
        if (row.size() != head.size())
            return; // a bin without weights: no record has a valid value
        rows.push_back(row);
    }
    if (rows.size() > 1)
        PrintTextTable(os, rows);
}

/// All that follows the heading of an attribute; `lastFigure` ends the line of figures.
template<class Results>
void PrintBody(std::ostream& os, const Results& results, const std::vector<std::string>& head,
               const std::string& lastFigure)
{
    PrintBins(os, results, head);
    if (!results.GetStatus().IsOK())
        os << "  " << DescribeStatus(results.GetStatus()) << '\n';
    if (!results.GetStatus().IsError())
        os << "  distinct values " << results.GetNDistinctValues() << ", missing weight "
           << FormatNumber(results.GetTotalWeightWithMissing() - results.GetTotalWeight()) << ", minimum "
           << FormatFigure(results.GetMinimum()) << ", maximum " << FormatFigure(results.GetMaximum()) << lastFigure
           << '\n';
    os << '\n';
}

} // namespace

void PrintResults(std::ostream& os, const BINVarList& list, const std::vector<BINAttributeTargetResults>& results)
{
    for (const BINAttributeTargetResults& result : results)
    {
        os << GetName(list, result.GetAttributeIndex()) << " by " << GetName(list, result.GetTargetIndex()) << '\n';
        PrintBody(os, result, MakeHead(list, result.GetTargetIndex()),
                  ", model entropy " + FormatFigure(result.GetModelEntropy()));
    }
}

void PrintResults(std::ostream& os, const BINVarList& list, const std::vector<BINAttributeResults>& results)
{
    for (const BINAttributeResults& result : results)
    {
        os << GetName(list, result.GetAttributeIndex()) << '\n';
        PrintBody(os, result, {"bin", "weight"}, "");
    }
}

void PrintLeftOut(std::ostream& os, const TableProfile& profile)
{
    std::string names;
    for (const Column& column : profile.columns)
        if (!column.isTarget && !column.isNumeric)
            names += (names.empty() ? "" : ", ") + Printable(column.name) + " (" + Quote(Shorten(column.firstText)) +
                     " in line " + std::to_string(column.firstTextLine) + ")";
    if (!names.empty())
        os << "Left out, as not all fields are numbers: " << names << '\n';
}
