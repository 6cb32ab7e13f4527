#include "bins/weightgrid.h"

#include <algorithm>
#include <array>
#include <cmath>
#include <iterator>
#include <limits>
#include <utility>

namespace
{

constexpr int kLeastExponent = std::numeric_limits<double>::min_exponent - std::numeric_limits<double>::digits;

constexpr std::array<std::pair<WeightRounding, const char*>, 3> kNames{
    {{WeightRounding::kNone, "none"}, {WeightRounding::kTruncate, "truncate"}, {WeightRounding::kClosest, "closest"}}};

double RoundToWhole(double weight, WeightRounding rounding)
{
    switch (rounding)
    {
    case WeightRounding::kNone:
        break;
    case WeightRounding::kTruncate:
        return std::floor(weight);
    case WeightRounding::kClosest:
        return std::floor(weight + 0.5);
    }
    return weight;
}

/// The least whole E with n w <= 2^E. Both are split into a fraction in [0.5, 1) and a power of two, so that nothing
/// overflows; where the rounded product of the fractions is 0.5, the fused operation tells whether the true one is
/// more.
int CeilLog2OfProduct(double n, double w)
{
    int exponentOfN = 0;
    int exponentOfW = 0;
    const double fractionOfN = std::frexp(n, &exponentOfN);
    const double fractionOfW = std::frexp(w, &exponentOfW);
    const int exponent = exponentOfN + exponentOfW;
    if (std::fma(fractionOfN, fractionOfW, -0.5) > 0.0)
        return exponent;
    return fractionOfN == 0.5 && fractionOfW == 0.5 ? exponent - 2 : exponent - 1;
}

/// The exponent of g. Every double is a multiple of the least denormal, so a finer grid is of no use.
int ComputeExponent(const WeightTally& tally)
{
    constexpr int kBitsOfSum = 52;
    if (tally.numPositive <= 0)
        return kLeastExponent;
    const int exponent =
        CeilLog2OfProduct(static_cast<double>(tally.numPositive), tally.largest * tally.scale) - kBitsOfSum;
    return std::clamp(exponent, kLeastExponent, std::numeric_limits<double>::max_exponent - 1);
}

} // namespace

const char* GetName(WeightRounding rounding)
{
    return kNames[static_cast<std::size_t>(rounding)].second;
}

std::optional<WeightRounding> FindWeightRounding(std::string_view name)
{
    for (const auto& [rounding, known] : kNames)
    {
        if (name == known)
            return rounding;
    }
    return std::nullopt;
}

void WeightTally::Add(double weight)
{
    const double rounded = RoundToWhole(weight, rounding);
    if (!(rounded > 0.0))
        return;
    ++numPositive;
    largest = std::max(largest, rounded);
}

void WeightTally::ScaleToRecords(double total)
{
    if (total > 0.0)
        scale = static_cast<double>(numPositive) / total;
}

WeightGrid::WeightGrid(const WeightTally& tally) : fRounding(tally.rounding), fScale(tally.scale)
{
    const int exponent = ComputeExponent(tally);
    const int exponents[] = {exponent / 2, exponent - exponent / 2};
    for (std::size_t i = 0; i < std::size(exponents); ++i)
    {
        fFactors[i] = std::ldexp(1.0, exponents[i]);
        fInverses[i] = std::ldexp(1.0, -exponents[i]);
    }
}

double WeightGrid::Round(double weight)
{
    const double rounded = RoundToWhole(weight, fRounding);
    if (!(rounded > 0.0))
        return 0.0;
    const double scaled = rounded * fScale;
    // In units of g a weight is at most 2^52, and from 2^52 on doubles are whole, so adding 2^52 rounds as nearbyint
    // does, in a fraction of its time. Where a product is a denormal and loses digits, it is far below half a unit.
    constexpr double kWholeFrom = 4503599627370496.0;
    const double units = std::max(1.0, scaled * fInverses[0] * fInverses[1] + kWholeFrom - kWholeFrom);
    double onGrid = units * fFactors[0] * fFactors[1];
    if (std::isinf(onGrid)) // the largest doubles lie nearest to 2^1024, which is none
        onGrid = (units - 1.0) * fFactors[0] * fFactors[1];
    fHasMoved = fHasMoved || onGrid != scaled;
    return onGrid;
}

std::optional<double> WeightGrid::GetStep() const
{
    return fHasMoved ? std::optional(fFactors[0] * fFactors[1]) : std::nullopt;
}
