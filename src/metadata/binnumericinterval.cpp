#include <mcobnqrt/binnumericinterval.h>

#include <limits>
#include <ostream>

namespace
{

/// The right end that counts as infinite; the left one is its negative.
constexpr double kInfiniteEnd = std::numeric_limits<double>::max();

} // namespace

BINNumericInterval::BINNumericInterval() : BINNumericInterval(0.0, 0.0) {}

BINNumericInterval::BINNumericInterval(double left, double right) : fLeftEnd(left), fRightEnd(right) {}

BINNumericInterval::BINNumericInterval(double end, bool leftInfinite)
    : fLeftEnd(leftInfinite ? -kInfiniteEnd : end), fRightEnd(leftInfinite ? end : kInfiniteEnd)
{
}

bool BINNumericInterval::Contains(double value) const
{
    return fLeftEnd <= value && value <= fRightEnd;
}

bool BINNumericInterval::IsEmpty() const
{
    return fRightEnd < fLeftEnd;
}

bool BINNumericInterval::operator==(const BINNumericInterval& other) const
{
    return fLeftEnd == other.fLeftEnd && fRightEnd == other.fRightEnd;
}

bool BINNumericInterval::SetLeftEnd(double value)
{
    fLeftEnd = value;
    return value <= fRightEnd;
}

bool BINNumericInterval::SetRightEnd(double value)
{
    fRightEnd = value;
    return value >= fLeftEnd;
}

bool BINNumericInterval::IsLeftEndInfinite() const
{
    return fLeftEnd == -kInfiniteEnd;
}

bool BINNumericInterval::IsRightEndInfinite() const
{
    return fRightEnd == kInfiniteEnd;
}

void BINNumericInterval::Display(std::ostream& os) const
{
    // The comparison is by order and not by equality, so that an IEEE infinity counts as infinite, too.
    os << "BINNumericInterval: ";
    if (fLeftEnd > -kInfiniteEnd)
        os << "[ " << fLeftEnd << ", ";
    else
        os << "( -infinity, ";
    if (fRightEnd < kInfiniteEnd)
        os << fRightEnd << " ]";
    else
        os << "infinity )";
    os << std::endl;
}
