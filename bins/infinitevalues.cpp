#include "bins/infinitevalues.h"

namespace
{

constexpr double kInfinity = std::numeric_limits<double>::infinity();
constexpr double kMax = std::numeric_limits<double>::max();
constexpr double kStandIn = 1.7976931348623155e308;     ///< of the positive infinity: the double below kMax
constexpr double kOuterFinite = 1.7976931348623153e308; ///< the double below that

/// A cut point on the outermost finite doubles, which were one value, keeps all of them on the side of that value.
double DecodeNumber(double cutPoint, bool isRightClosed)
{
    const bool isNearestTo0 = cutPoint == (isRightClosed ? -kOuterFinite : kOuterFinite);
    return isNearestTo0 ? cutPoint : DecodeInfinity(cutPoint);
}

} // namespace

double EncodeInfinity(double value)
{
    if (std::isinf(value))
        return std::copysign(kStandIn, value);
    return std::fabs(value) > kOuterFinite ? std::copysign(kOuterFinite, value) : value;
}

double DecodeInfinity(double value)
{
    if (std::fabs(value) == kStandIn)
        return std::copysign(kInfinity, value);
    return std::fabs(value) == kOuterFinite ? std::copysign(kMax, value) : value;
}

double InfiniteValues::EncodeOuter(double value)
{
    fHasNegative = fHasNegative || value == -kInfinity;
    fHasPositive = fHasPositive || value == kInfinity;
    const double encoded = EncodeInfinity(value);
    if (std::isfinite(value))
        Note(encoded);
    return encoded;
}

double InfiniteValues::DecodeCutPoint(double cutPoint, bool isRightClosed) const
{
    if (std::fabs(cutPoint) == kStandIn)
        return DecodeInfinity(cutPoint);
    if (fHasPositive && cutPoint > fLargest)
        return isRightClosed ? DecodeNumber(fLargest, true) : kInfinity;
    if (fHasNegative && cutPoint < fSmallest)
        return isRightClosed ? -kInfinity : DecodeNumber(fSmallest, false);
    return DecodeNumber(cutPoint, isRightClosed);
}
