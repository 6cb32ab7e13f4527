#include "bins/labels.h"

#include "bins/dates.h"
#include "bins/lookup.h"
#include "bins/numbers.h"
#include "bins/text.h"
#include "bins/words.h"

#include <algorithm>
#include <cmath>
#include <limits>
#include <set>

namespace
{

constexpr double kInfinity = std::numeric_limits<double>::infinity();

std::string FormatEnd(double end, const Variable& variable)
{
    return end == kInfinity ? "+inf" : FormatValue(end, variable);
}

std::string MakeInterval(const AttributeBins& bins, std::size_t index, const std::vector<std::string>& borders)
{
    const Bin& bin = bins.bins[index];
    const bool isInfinity = bin.left == bin.right;
    const bool isLeftClosed = isInfinity || (!bins.isRightClosed && bin.left != -kInfinity);
    const bool isRightClosed = isInfinity || (bins.isRightClosed && bin.right != kInfinity);
    const std::string left = index == 0 ? "-inf" : borders[index - 1];
    const std::string right = index == borders.size() ? "+inf" : borders[index];
    return (isLeftClosed ? "[" : "(") + left + ", " + right + (isRightClosed ? "]" : ")");
}

bool HasSeveralTargets(const Bins& bins)
{
    const Variable* target = nullptr;
    for (const AttributeBins& result : bins.results)
    {
        if (target && result.target.get() != target)
            return true;
        target = result.target.get();
    }
    return false;
}

} // namespace

std::string FormatValue(double value, const Variable& variable)
{
    std::optional<std::string> text;
    switch (variable.valueKind)
    {
    case ValueKind::kNumber:
        break;
    case ValueKind::kBoolean:
        if (value == 0.0 || value == 1.0)
            text = value == 0.0 ? "false" : "true";
        break;
    case ValueKind::kDate:
        text = FormatDate(value);
        break;
    case ValueKind::kTimestamp:
        text = FormatTimestamp(value);
        if (text && !variable.timeZone.empty())
            *text += "+00:00";
        break;
    }
    return text.value_or(FormatNumber(value));
}

std::vector<double> MakeBorders(const AttributeBins& bins)
{
    std::vector<double> borders = bins.cutPoints;
    const ValueKind kind = bins.attribute->valueKind;
    if (kind == ValueKind::kDate || kind == ValueKind::kTimestamp)
    {
        for (double& border : borders) border = bins.isRightClosed ? std::floor(border) : std::ceil(border);
    }
    return borders;
}

std::vector<std::string> FormatBorders(const AttributeBins& bins)
{
    if (!bins.borderTexts.empty())
        return bins.borderTexts;
    std::vector<std::string> texts;
    for (const double border : MakeBorders(bins)) texts.push_back(FormatEnd(border, *bins.attribute));
    return texts;
}

std::string FormatCategory(const Variable& variable, std::size_t code)
{
    const std::string& category = variable.categories[code];
    if (variable.valueKind == ValueKind::kNumber)
        return category;
    return FormatValue(ParseNumberOrNaN(category), variable);
}

std::vector<std::vector<std::size_t>> FindCodes(const AttributeBins& bins)
{
    std::vector<std::vector<std::size_t>> codes(bins.bins.size());
    for (std::size_t code = 0; code < bins.attribute->categories.size(); ++code)
    {
        const std::size_t bin = FindBin(bins.cutPoints, bins.isRightClosed, static_cast<double>(code));
        if (bin < codes.size())
            codes[bin].push_back(code);
    }
    return codes;
}

std::vector<std::string> MakeLabels(const AttributeBins& bins)
{
    std::vector<std::string> labels;
    if (bins.attribute->IsCategorical())
    {
        for (const std::vector<std::size_t>& codes : FindCodes(bins))
        {
            std::vector<std::string> categories;
            categories.reserve(codes.size());
            for (const std::size_t code : codes) categories.push_back(FormatCategory(*bins.attribute, code));
            labels.push_back("{" + Join(categories, ", ") + "}");
        }
        return labels;
    }
    const std::vector<std::string> borders = FormatBorders(bins);
    labels.reserve(bins.bins.size());
    for (std::size_t i = 0; i < bins.bins.size(); ++i) labels.push_back(MakeInterval(bins, i, borders));
    return labels;
}

std::vector<BinColumn> MakeBinColumns(const Bins& bins, const std::vector<std::string>& taken, Encoding encoding)
{
    std::set<std::string> names(taken.begin(), taken.end());
    const bool hasSeveralTargets = HasSeveralTargets(bins);
    std::vector<BinColumn> columns;
    for (const AttributeBins& result : bins.results)
    {
        if (!result.HasBins())
            continue;
        const std::string by = hasSeveralTargets && result.target ? "_by_" + result.target->name : "";
        const std::string plain = result.attribute->name + by + "_" + GetSuffix(encoding);
        std::string name = plain;
        for (int i = 2; !names.insert(name).second; ++i) name = plain + "_" + std::to_string(i);
        columns.push_back({&result, name});
    }
    return columns;
}

std::vector<std::string> DescribeUnbinned(const Bins& bins)
{
    std::vector<std::string> descriptions;
    for (const AttributeBins& result : bins.results)
    {
        if (!result.HasBins())
            descriptions.push_back(Quote(result.attribute->name) + " has no bins: " + DescribeStatus(result.status));
    }
    return descriptions;
}
