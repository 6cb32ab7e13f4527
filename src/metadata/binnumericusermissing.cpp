#include <mcobnqrt/binnumericusermissing.h>

#include "metadata/labelledvalues.h"

#include <algorithm>
#include <memory>
#include <ostream>

BINNumericUserMissing::BINNumericUserMissing() = default;

BINNumericUserMissing::BINNumericUserMissing(const BINNumericUserMissing& other) = default;

BINNumericUserMissing& BINNumericUserMissing::operator=(const BINNumericUserMissing& other)
{
    // The copy is made first, so that a failure doesn't leave values without their labels.
    BINNumericUserMissing copy(other);
    fValues.swap(copy.fValues);
    fLabels.swap(copy.fLabels);
    fInterval = copy.fInterval;
    fHasInterval = copy.fHasInterval;
    return *this;
}

BINNumericUserMissing::~BINNumericUserMissing() = default;

IBINUserMissing::DataType BINNumericUserMissing::GetDataType() const
{
    return DataTypeNumeric;
}

int BINNumericUserMissing::GetNDiscreteValues() const
{
    return static_cast<int>(fValues.size());
}

bool BINNumericUserMissing::HasInterval() const
{
    return fHasInterval;
}

IBINUserMissing* BINNumericUserMissing::Clone() const
{
    return std::make_unique<BINNumericUserMissing>(*this).release();
}

bool BINNumericUserMissing::IsEqualTo(const IBINUserMissing* other) const
{
    if (!other || other->GetDataType() != DataTypeNumeric)
        return false;
    const auto& numeric = static_cast<const BINNumericUserMissing&>(*other);
    if (fValues != numeric.fValues || fHasInterval != numeric.fHasInterval)
        return false;
    return !fHasInterval || fInterval == numeric.fInterval;
}

void BINNumericUserMissing::Display(std::ostream& os) const
{
    os << std::endl << "Start of BINNumericUserMissing display" << std::endl;
    DisplayLabelled(os, fValues, fLabels);
    if (fHasInterval)
    {
        os << "Missing interval:" << std::endl;
        fInterval.Display(os);
    }
    os << "End of BINNumericUserMissing display" << std::endl;
}

void BINNumericUserMissing::AddValue(double value, const std::string& label)
{
    AppendLabelled(fValues, fLabels, value, label);
}

void BINNumericUserMissing::SetInterval(const BINNumericInterval& interval)
{
    fInterval = interval;
    fHasInterval = true;
}

bool BINNumericUserMissing::Contains(double value) const
{
    return std::find(fValues.begin(), fValues.end(), value) != fValues.end() ||
           (fHasInterval && fInterval.Contains(value));
}

const BINNumericInterval* BINNumericUserMissing::GetInterval() const
{
    return fHasInterval ? &fInterval : nullptr;
}
