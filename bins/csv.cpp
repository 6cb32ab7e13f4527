#include "bins/csv.h"

#include "bins/labels.h"
#include "bins/measures.h"
#include "bins/numbers.h"
#include "bins/text.h"

#include <algorithm>
#include <vector>

namespace
{

using Targets = std::vector<const Variable*>;

/// The targets of the results, each once.
Targets FindTargets(const Bins& bins)
{
    Targets targets;
    for (const AttributeBins& result : bins.results)
    {
        if (result.target && std::find(targets.begin(), targets.end(), result.target.get()) == targets.end())
            targets.push_back(result.target.get());
    }
    return targets;
}

std::vector<std::string> MakeHead(const Targets& targets)
{
    std::vector<std::string> head{"attribute", "target", "bin",   "label", "left", "right",
                                  "closed",    "weight", "share", "rate",  "woe",  "iv"};
    for (const Variable* const target : targets)
    {
        for (std::size_t code = 0; code < target->categories.size(); ++code)
            head.push_back("weight:" + (targets.size() > 1 ? target->name + "=" : "") + FormatCategory(*target, code));
    }
    return head;
}

/// Writes the rows of the bins of one result.
class Rows
{
public:
    Rows(const AttributeBins& bins, const Targets& targets)
        : fBins(bins), fTargets(targets), fLabels(MakeLabels(bins)), fEvidence(ComputeEvidence(bins))
    {
    }

    std::vector<std::string> Make(std::size_t index) const
    {
        const Bin& bin = fBins.bins[index];
        std::vector<std::string> row{fBins.attribute->name,
                                     fBins.target ? fBins.target->name : "",
                                     std::to_string(index),
                                     fLabels[index],
                                     FormatNumber(bin.left),
                                     FormatNumber(bin.right),
                                     fBins.isRightClosed ? "right" : "left",
                                     FormatNumber(bin.weight),
                                     FormatNumber(ComputeShare(bin.weight, fBins.weight))};
        for (double Evidence::*const member :
             {&Evidence::rate, &Evidence::weightOfEvidence, &Evidence::informationValue})
            row.push_back(fEvidence.empty() ? "" : FormatNumber(fEvidence[index].*member));
        for (const Variable* const target : fTargets)
        {
            for (std::size_t code = 0; code < target->categories.size(); ++code)
                row.push_back(target == fBins.target.get() ? FormatNumber(bin.weights[code]) : "");
        }
        return row;
    }

private:
    const AttributeBins& fBins;
    const Targets& fTargets;
    std::vector<std::string> fLabels;
    std::vector<Evidence> fEvidence;
};

std::string MakeLine(std::vector<std::string> row)
{
    for (std::string& field : row) field = QuoteField(field, ',');
    return Join(row, ",") + "\n";
}

} // namespace

std::string ToCsv(const Bins& bins)
{
    const Targets targets = FindTargets(bins);
    std::string csv = MakeLine(MakeHead(targets));
    for (const AttributeBins& result : bins.results)
    {
        const Rows rows(result, targets);
        for (std::size_t i = 0; i < result.bins.size(); ++i) csv += MakeLine(rows.Make(i));
    }
    return csv;
}

std::string QuoteField(std::string_view field, char delimiter)
{
    const auto mustBeQuoted = [delimiter](char c) { return c == delimiter || c == '"' || c == '\n' || c == '\r'; };
    const auto isSpace = [](char c) { return c == ' ' || c == '\t'; };
    const bool hasOuterSpace = !field.empty() && (isSpace(field.front()) || isSpace(field.back()));
    if (hasOuterSpace || std::any_of(field.begin(), field.end(), mustBeQuoted))
        return Enclose(field, '"');
    return std::string(field);
}
