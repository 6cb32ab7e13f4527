#include "hosts/mcbin/figures.h"

#include "bins/numbers.h"
#include "hosts/mcbin/findings.h"
#include "hosts/mcbin/text.h"

#include <algorithm>
#include <cmath>
#include <limits>
#include <numeric>

double GetEntropy(const std::vector<double>& weights)
{
    const double total = std::accumulate(weights.begin(), weights.end(), 0.0);
    double entropy = 0.0;
    for (const double weight : weights)
        if (weight > 0.0)
            entropy -= weight / total * std::log2(weight / total);
    return entropy;
}

std::vector<double> GetCategoryWeights(const Result& result)
{
    std::vector<double> sums;
    for (const Bin& bin : result.bins)
    {
        sums.resize(std::max(sums.size(), bin.weights.size()));
        for (std::size_t i = 0; i < bin.weights.size(); ++i) sums[i] += bin.weights[i];
    }
    return sums;
}

bool HasTwoCategories(const Findings& findings, const Result& result)
{
    const Variable* const target = findings.FindTarget(result);
    return target && target->categories.size() == 2;
}

std::vector<std::size_t> GetHeaviest(const std::vector<double>& weights, std::size_t number)
{
    std::vector<std::size_t> codes(weights.size());
    std::iota(codes.begin(), codes.end(), std::size_t(0));
    std::stable_sort(codes.begin(), codes.end(), [&](std::size_t a, std::size_t b) { return weights[a] > weights[b]; });
    codes.resize(std::min(codes.size(), number));
    std::sort(codes.begin(), codes.end());
    return codes;
}

double GetGain(const Result& result)
{
    if (!result.targetEntropy || !result.modelEntropy || result.cutPoints.empty())
        return 0.0;
    // No cut raises the entropy, so a difference below this is what rounding has left.
    constexpr double kRounding = 1e-12;
    const double gain = *result.targetEntropy - *result.modelEntropy;
    return gain < kRounding * std::max(1.0, *result.targetEntropy) ? 0.0 : gain;
}

double GetShare(double part, double whole)
{
    return whole > 0.0 ? part / whole : 0.0;
}

double GetWeightOfEvidence(const Bin& bin, const std::vector<double>& categoryWeights)
{
    return std::log(GetShare(bin.weights[1], categoryWeights[1]) / GetShare(bin.weights[0], categoryWeights[0]));
}

double GetInformationValue(const Bin& bin, const std::vector<double>& categoryWeights)
{
    return (GetShare(bin.weights[1], categoryWeights[1]) - GetShare(bin.weights[0], categoryWeights[0])) *
           GetWeightOfEvidence(bin, categoryWeights);
}

double GetInformationValue(const Result& result)
{
    const std::vector<double> categoryWeights = GetCategoryWeights(result);
    double value = 0.0;
    for (const Bin& bin : result.bins) value += GetInformationValue(bin, categoryWeights);
    return value;
}

std::vector<const Result*> SortByGain(const Findings& findings)
{
    std::vector<const Result*> sorted;
    for (const Result& result : findings.results)
        if (!result.cutPoints.empty())
            sorted.push_back(&result);
    std::stable_sort(sorted.begin(), sorted.end(),
                     [](const Result* left, const Result* right) { return GetGain(*left) > GetGain(*right); });
    return sorted;
}

std::vector<const Result*> GetUncut(const Findings& findings)
{
    std::vector<const Result*> uncut;
    for (const Result& result : findings.results)
        if (result.cutPoints.empty())
            uncut.push_back(&result);
    return uncut;
}

std::string FormatInterval(const Findings& findings, const Bin& bin)
{
    constexpr double kInfinity = std::numeric_limits<double>::infinity();
    const auto format = [](double end) { return (end == kInfinity ? "+" : "") + FormatNumber(end); };
    const bool isInfinity = bin.left == bin.right;
    const bool isLeftClosed = isInfinity || (!findings.settings.isRightClosed && bin.left != -kInfinity);
    const bool isRightClosed = isInfinity || (findings.settings.isRightClosed && bin.right != kInfinity);
    return (isLeftClosed ? "[" : "(") + format(bin.left) + ", " + format(bin.right) + (isRightClosed ? "]" : ")");
}

std::string DescribeValues(const Findings& findings, const Result& result)
{
    const Variable& attribute = findings.GetAttribute(result);
    const auto format = [&](const std::optional<double>& value)
    {
        const bool isCode = attribute.IsCategorical() && value;
        return isCode ? Quote(Shorten(attribute.categories.at(static_cast<std::size_t>(*value)))) : FormatFigure(value);
    };
    return std::to_string(result.distinctValues) + (attribute.IsCategorical() ? " categories" : " distinct values") +
           " from " + format(result.minimum) + " to " + format(result.maximum);
}

std::string DescribeWithoutWeight(const Findings& findings)
{
    const long number = findings.recordsWithoutWeight.value_or(0);
    return number == 0 ? "" : std::to_string(number) + (number == 1 ? " record" : " records");
}

std::vector<std::string> GetBinCategories(const Findings& findings, const Result& result, const Bin& bin)
{
    const std::vector<std::string>& all = findings.GetAttribute(result).categories;
    const auto place = static_cast<std::size_t>(&bin - result.bins.data());
    std::vector<std::string> categories;
    for (std::size_t code = 0; code < all.size(); ++code)
        if (FindBin(result.cutPoints, findings.settings.isRightClosed, static_cast<double>(code)) == place)
            categories.push_back(all[code]);
    return categories;
}

std::string FormatBin(const Findings& findings, const Result& result, const Bin& bin)
{
    if (!findings.GetAttribute(result).IsCategorical())
        return FormatInterval(findings, bin);
    return "{" + Join(GetBinCategories(findings, result, bin), ", ") + "}";
}

std::string GetBinColumn(const Findings& findings, const Result& result)
{
    const auto isSame = [&](const Result& other) { return other.attribute == result.attribute; };
    const bool isOne = std::count_if(findings.results.begin(), findings.results.end(), isSame) == 1;
    const Variable* const target = isOne ? nullptr : findings.FindTarget(result);
    return findings.GetAttribute(result).name + (target ? "_by_" + target->name : "") + "_bin";
}

std::size_t FindBin(const std::vector<double>& cutPoints, bool isRightClosed, double value)
{
    const auto border = isRightClosed ? std::lower_bound(cutPoints.begin(), cutPoints.end(), value)
                                      : std::upper_bound(cutPoints.begin(), cutPoints.end(), value);
    return static_cast<std::size_t>(border - cutPoints.begin());
}
