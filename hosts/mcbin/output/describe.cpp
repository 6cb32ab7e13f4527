#include "hosts/mcbin/output/describe.h"

#include "bins/evaluation.h"
#include "bins/labels.h"
#include "bins/numbers.h"
#include "bins/text.h"

#include <fmt/format.h>

#include <algorithm>
#include <numeric>

std::vector<std::size_t> FindHeaviest(const std::vector<double>& weights, std::size_t number)
{
    std::vector<std::size_t> codes(weights.size());
    std::iota(codes.begin(), codes.end(), std::size_t(0));
    std::stable_sort(codes.begin(), codes.end(), [&](std::size_t a, std::size_t b) { return weights[a] > weights[b]; });
    codes.resize(std::min(codes.size(), number));
    std::sort(codes.begin(), codes.end());
    return codes;
}

std::string MakeHeading(const AttributeBins& bins)
{
    const std::string name = Printable(bins.attribute->name);
    return bins.target ? name + " by " + Printable(bins.target->name) : name;
}

std::vector<const AttributeBins*> FindUncut(const Bins& bins)
{
    std::vector<const AttributeBins*> uncut;
    for (const AttributeBins& result : bins.results)
    {
        if (result.cutPoints.empty())
            uncut.push_back(&result);
    }
    return uncut;
}

std::string DescribeValues(const AttributeBins& bins)
{
    const Variable& attribute = *bins.attribute;
    const auto format = [&](const std::optional<double>& value)
    {
        const bool isCode = attribute.IsCategorical() && value;
        return isCode ? Quote(Shorten(FormatCategory(attribute, static_cast<std::size_t>(*value))))
                      : FormatFigure(value);
    };
    const std::string what = attribute.IsCategorical() ? "categories" : "distinct values";
    const std::string number = bins.numDistinct ? std::to_string(*bins.numDistinct) + " " + what : "values";
    return number + " from " + format(bins.minimum) + " to " + format(bins.maximum) + (bins.isEdited ? ", edited" : "");
}

std::vector<std::string> DescribeStrangers(const Evaluation& evaluation, std::size_t index)
{
    const AttributeBins& first = evaluation.GetFirst(index);
    const Strangers& strangers = evaluation.strangers[index];
    std::vector<std::string> descriptions;
    const auto describe = [&](double weight, const char* where, const std::optional<double>& end)
    {
        if (weight > 0.0)
        {
            descriptions.push_back("weight of values " + (where + (" " + FormatValue(*end, *first.attribute))) +
                                   ", which the bins were made without: " + FormatWeight(weight));
        }
    };
    describe(strangers.below, "below", first.minimum);
    describe(strangers.above, "above", first.maximum);
    return descriptions;
}

std::string DescribeWithoutWeight(const Bins& bins)
{
    const std::int64_t number = bins.numRecordsWithoutWeight.value_or(0);
    return number == 0 ? "" : std::to_string(number) + (number == 1 ? " record" : " records");
}

std::string DescribeEvidence(const AttributeBins& bins)
{
    if (const std::optional<double> value = ComputeInformationValue(bins))
        return fmt::format("rate and WoE of {}; information value {:.4f}", Quote(bins.target->categories[1]), *value);
    return "";
}

std::string DescribeSmoothing(const AttributeBins& bins)
{
    return IsSmoothed(bins) ? FormatNumber(bins.smoothing) + " added where a category has no weight" : "";
}

std::string FormatWeightOfEvidence(const BinRow& row, const Evidence& evidence)
{
    return row.kind == BinRow::Kind::kTotal ? "" : fmt::format("{:+.3f}", evidence.weightOfEvidence);
}

std::vector<std::string> ListCategories(const AttributeBins& bins, std::size_t bin)
{
    std::vector<std::string> categories;
    if (bins.attribute->IsCategorical())
    {
        const std::vector<std::vector<std::size_t>> codes = FindCodes(bins);
        for (const std::size_t code : codes[bin]) categories.push_back(FormatCategory(*bins.attribute, code));
    }
    return categories;
}
