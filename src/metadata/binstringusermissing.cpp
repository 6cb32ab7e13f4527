#include <mcobnqrt/binstringusermissing.h>

#include "metadata/labelledvalues.h"

#include <algorithm>
#include <memory>
#include <ostream>

BINStringUserMissing::BINStringUserMissing() = default;

BINStringUserMissing::BINStringUserMissing(const BINStringUserMissing& other) = default;

BINStringUserMissing& BINStringUserMissing::operator=(const BINStringUserMissing& other)
{
    // The copy is made first, so that a failure doesn't leave values without their labels.
    BINStringUserMissing copy(other);
    fValues.swap(copy.fValues);
    fLabels.swap(copy.fLabels);
    return *this;
}

BINStringUserMissing::~BINStringUserMissing() = default;

IBINUserMissing::DataType BINStringUserMissing::GetDataType() const
{
    return DataTypeString;
}

int BINStringUserMissing::GetNDiscreteValues() const
{
    return static_cast<int>(fValues.size());
}

bool BINStringUserMissing::HasInterval() const
{
    return false;
}

IBINUserMissing* BINStringUserMissing::Clone() const
{
    return std::make_unique<BINStringUserMissing>(*this).release();
}

bool BINStringUserMissing::IsEqualTo(const IBINUserMissing* other) const
{
    return other && other->GetDataType() == DataTypeString &&
           fValues == static_cast<const BINStringUserMissing&>(*other).fValues;
}

void BINStringUserMissing::Display(std::ostream& os) const
{
    os << std::endl << "Start of BINStringUserMissing display" << std::endl;
    DisplayLabelled(os, fValues, fLabels);
    os << "End of BINStringUserMissing display" << std::endl;
}

void BINStringUserMissing::AddValue(const std::string& value, const std::string& label)
{
    AppendLabelled(fValues, fLabels, value, label);
}

bool BINStringUserMissing::Contains(const std::string& value) const
{
    return std::find(fValues.begin(), fValues.end(), value) != fValues.end();
}
