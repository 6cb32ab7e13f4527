#include "bins/cutrounding.h"

#include "bins/numbers.h"

#include <algorithm>
#include <cmath>
#include <cstdint>
#include <limits>
#include <string>
#include <utility>

namespace
{

/// The double that is nearest to `factor` times ten to the power of `exponent`; NaN if it is too large for one.
double MakeDecimal(std::int64_t factor, int exponent)
{
    return ParseNumberOrNaN(std::to_string(factor) + "e" + std::to_string(exponent));
}

/// A multiple of the power of ten that is a cut point between the values; NaN if there is none. If there is one on a
/// side of `cutPoint`, the multiple next to it is one. A neighbour more is looked at, as the quotient is rounded.
double FindMultiple(double below, double above, double cutPoint, bool isRightClosed, int exponent)
{
    double found = std::numeric_limits<double>::quiet_NaN();
    const double quotient = std::floor(cutPoint / MakeDecimal(1, exponent));
    if (!std::isfinite(quotient)) // at either end of the range of doubles
        return found;
    const auto middle = static_cast<std::int64_t>(quotient);
    for (std::int64_t factor = middle - 1; factor <= middle + 2; ++factor)
    {
        const double decimal = MakeDecimal(factor, exponent);
        const bool isBetween =
            isRightClosed ? below <= decimal && decimal < above : below < decimal && decimal <= above;
        if (isBetween && !(std::abs(decimal - cutPoint) >= std::abs(found - cutPoint)))
            found = decimal;
    }
    return found;
}

void RoundCutPoints(AttributeBins& bins, const std::vector<ValueRange>& ranges)
{
    ValueRange below;
    for (std::size_t cut = 0; cut < bins.cutPoints.size(); ++cut)
    {
        below.Add(ranges[cut]);
        ValueRange above;
        for (std::size_t bin = cut + 1; bin < ranges.size() && above.IsEmpty(); ++bin) above.Add(ranges[bin]);
        double& cutPoint = bins.cutPoints[cut];
        cutPoint = FindShortestDecimal(below.largest, above.least, cutPoint, bins.isRightClosed);
        bins.bins[cut].right = bins.bins[cut + 1].left = cutPoint;
    }
}

} // namespace

double FindShortestDecimal(double below, double above, double cutPoint, bool isRightClosed)
{
    constexpr int kMostDigits = 17;
    if (!std::isfinite(below) || !std::isfinite(above))
        return cutPoint;
    const double largest = std::max(std::abs(below), std::abs(above));
    const int first = largest > 0.0 ? static_cast<int>(std::ceil(std::log10(largest))) : 0;
    for (int exponent = first; exponent > first - kMostDigits; --exponent)
    {
        const double found = FindMultiple(below, above, cutPoint, isRightClosed, exponent);
        if (!std::isnan(found))
            return found;
    }
    return cutPoint;
}

Bins RoundCutPoints(const Evaluation& evaluation)
{
    Bins rounded = evaluation.first;
    rounded.settings.areCutsRounded = true;
    for (std::size_t i = 0; i < evaluation.indices.size(); ++i)
    {
        AttributeBins& bins = rounded.results[evaluation.indices[i]];
        if (!bins.attribute->IsCategorical() && bins.attribute->valueKind == ValueKind::kNumber)
            RoundCutPoints(bins, evaluation.ranges[i]);
    }
    return rounded;
}
