#include "bins/csv.h"

#include "bins/labels.h"
#include "bins/numbers.h"
#include "bins/rows.h"
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

std::string TellCategory(const Targets& targets, const Variable& target, std::size_t code)
{
    return (targets.size() > 1 ? target.name + "=" : "") + FormatCategory(target, code);
}

std::vector<std::string> MakeHead(const Targets& targets)
{
    std::vector<std::string> head{"attribute", "target", "bin",   "label", "left", "right",
                                  "closed",    "weight", "share", "rate",  "woe",  "iv"};
    for (const Variable* const target : targets)
    {
        for (std::size_t code = 0; code < target->categories.size(); ++code)
            head.push_back("weight:" + TellCategory(targets, *target, code));
    }
    for (const Variable* const target : targets)
    {
        if (target->categories.size() <= 2)
            continue;
        for (const char* const figure : {"rate:", "woe:", "iv:"})
        {
            for (std::size_t code = 0; code < target->categories.size(); ++code)
                head.push_back(figure + TellCategory(targets, *target, code));
        }
    }
    return head;
}

/// The number of a bin; of the other rows what they are.
std::string TellBin(const BinRow& row, std::size_t index)
{
    return row.kind == BinRow::Kind::kBin ? std::to_string(index) : row.label;
}

std::string TellBorder(const BinRow& row, double border)
{
    return row.kind == BinRow::Kind::kBin ? FormatNumber(border) : "";
}

using Figure = double Evidence::*;
constexpr Figure kFigures[] = {&Evidence::rate, &Evidence::weightOfEvidence, &Evidence::informationValue};

std::string TellFigure(const std::optional<Evidence>& evidence, Figure figure)
{
    return evidence ? FormatNumber((*evidence).*figure) : "";
}

std::vector<std::string> MakeFields(const AttributeBins& bins, const BinRow& row, std::size_t index,
                                    const Targets& targets)
{
    std::vector<std::string> fields{bins.attribute->name,
                                    bins.target ? bins.target->name : "",
                                    TellBin(row, index),
                                    row.label,
                                    TellBorder(row, row.bin.left),
                                    TellBorder(row, row.bin.right),
                                    bins.isRightClosed ? "right" : "left",
                                    FormatNumber(row.bin.weight),
                                    FormatNumber(row.share)};
    for (const Figure figure : kFigures) fields.push_back(TellFigure(row.evidence, figure));
    for (const Variable* const target : targets)
    {
        for (std::size_t code = 0; code < target->categories.size(); ++code)
            fields.push_back(target == bins.target.get() ? FormatNumber(row.bin.weights[code]) : "");
    }
    for (const Variable* const target : targets)
    {
        if (target->categories.size() <= 2)
            continue;
        for (const Figure figure : kFigures)
        {
            for (std::size_t code = 0; code < target->categories.size(); ++code)
                fields.push_back(target == bins.target.get() ? TellFigure(row.evidenceByCategory[code], figure) : "");
        }
    }
    return fields;
}

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
        const std::vector<BinRow> rows = MakeRows(result);
        for (std::size_t i = 0; i < rows.size(); ++i) csv += MakeLine(MakeFields(result, rows[i], i, targets));
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
