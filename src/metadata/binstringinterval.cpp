#include <mcobnqrt/binstringinterval.h>

#include <ostream>

BINStringInterval::BINStringInterval() : BINStringInterval(".", true, ".", true) {}

BINStringInterval::BINStringInterval(const std::string& left, bool leftIncluded, const std::string& right,
                                     bool rightIncluded)
    : fLeftEnd(left), fLeftIncluded(leftIncluded), fRightEnd(right), fRightIncluded(rightIncluded)
{
}

BINStringInterval::BINStringInterval(const BINStringInterval& other) = default;

BINStringInterval& BINStringInterval::operator=(const BINStringInterval& other)
{
    // The copy is made first, so that no mixture of two intervals is left if the second string finds no memory.
    BINStringInterval copy(other);
    fLeftEnd.swap(copy.fLeftEnd);
    fLeftIncluded = copy.fLeftIncluded;
    fRightEnd.swap(copy.fRightEnd);
    fRightIncluded = copy.fRightIncluded;
    return *this;
}

BINStringInterval::~BINStringInterval() = default;

bool BINStringInterval::Contains(const std::string& value) const
{
    const bool isRightOfLeftEnd = value > fLeftEnd || (fLeftIncluded && value == fLeftEnd);
    const bool isLeftOfRightEnd = value < fRightEnd || (fRightIncluded && value == fRightEnd);
    return isRightOfLeftEnd && isLeftOfRightEnd;
}

bool BINStringInterval::IsEmpty() const
{
    if (fLeftEnd == fRightEnd)
        return !(fLeftIncluded && fRightIncluded);
    return fLeftEnd > fRightEnd;
}

bool BINStringInterval::operator==(const BINStringInterval& other) const
{
    return fLeftEnd == other.fLeftEnd && fLeftIncluded == other.fLeftIncluded && fRightEnd == other.fRightEnd &&
           fRightIncluded == other.fRightIncluded;
}

bool BINStringInterval::SetLeftEnd(const std::string& value, bool included)
{
    fLeftEnd = value;
    fLeftIncluded = included;
    return !IsEmpty();
}

bool BINStringInterval::SetRightEnd(const std::string& value, bool included)
{
    fRightEnd = value;
    fRightIncluded = included;
    return !IsEmpty();
}

void BINStringInterval::Display(std::ostream& os) const
{
    os << "BINStringInterval: " << (fLeftIncluded ? "[ " : "( ") << fLeftEnd << ", " << fRightEnd
       << (fRightIncluded ? " ]" : " )") << std::endl;
}
