#include <mcobnqrt/bincatnumencoder.h>

#include <mcobnqrt/binnumericusermissing.h>
#include <mcobnqrt/mccommon.h>

#include "metadata/categorycodes.h"
#include "metadata/ownership.h"

#include <cmath>
#include <cstddef>
#include <ostream>

namespace
{

template<class Element>
void DisplaySevenALine(std::ostream& os, const std::vector<Element>& elements)
{
    for (std::size_t i = 0; i < elements.size(); ++i)
    {
        os << elements[i] << ' ';
        if (i % 7 == 6)
            os << std::endl;
    }
    os << std::endl;
}

} // namespace

BINCatNumEncoder::BINCatNumEncoder(int expectedCategories)
{
    fValues.reserve(static_cast<std::size_t>(expectedCategories));
}

BINCatNumEncoder::BINCatNumEncoder(const std::vector<double>& values)
{
    for (const double value : values) Encode(value);
}

BINCatNumEncoder::BINCatNumEncoder(const BINCatNumEncoder& other)
    : IBINEncoder(other), fCodes(other.fCodes), fValues(other.fValues), fValueLabels(other.fValueLabels),
      fLastCode(other.fLastCode), fUserMissing(CloneOf(other.fUserMissing))
{
}

BINCatNumEncoder& BINCatNumEncoder::operator=(const BINCatNumEncoder& other)
{
    if (this == &other)
        return *this;
    // The copy is made first, so that a failure doesn't leave the map and the table at odds.
    BINCatNumEncoder copy(other);
    fCodes.swap(copy.fCodes);
    fValues.swap(copy.fValues);
    fValueLabels.swap(copy.fValueLabels);
    fLastCode = copy.fLastCode;
    fUserMissing.swap(copy.fUserMissing);
    return *this;
}

BINCatNumEncoder::~BINCatNumEncoder() = default;

IBINEncoder::EncoderType BINCatNumEncoder::GetEncoderType() const
{
    return EncoderTypeCatNum;
}

int BINCatNumEncoder::GetNumberOfCategories() const
{
    return static_cast<int>(fCodes.size());
}

void BINCatNumEncoder::SetValueLabels(const std::vector<std::string>& labels)
{
    ReplaceLabels(fValueLabels, labels);
}

void BINCatNumEncoder::SetValueLabel(int code, const std::string& label)
{
    StoreLabel(fValueLabels, GetNumberOfCategories(), code, label);
}

const std::vector<std::string>* BINCatNumEncoder::GetValueLabels() const
{
    return &fValueLabels;
}

bool BINCatNumEncoder::SetUserMissingInfo(IBINUserMissing* userMissing)
{
    return AdoptUserMissing(fUserMissing, userMissing, IBINUserMissing::DataTypeNumeric);
}

IBINUserMissing* BINCatNumEncoder::GetUserMissingInfo() const
{
    return fUserMissing.get();
}

IBINEncoder* BINCatNumEncoder::Clone() const
{
    return std::make_unique<BINCatNumEncoder>(*this).release();
}

void BINCatNumEncoder::Display(std::ostream& os) const
{
    os << "\tBINCatNumEncoder: Last code = " << fLastCode << std::endl;
    os << "\t\tNumeric values of categories: ";
    DisplaySevenALine(os, fValues);
    if (!fValueLabels.empty())
    {
        os << "\t\tValue Labels:\n";
        DisplaySevenALine(os, fValueLabels);
    }
    DisplayUserMissingOfEncoder(os, fUserMissing.get());
    os << std::endl;
}

double BINCatNumEncoder::Encode(double value)
{
    if (IsMissing(value))
        return kMissingCode;
    return FindOrAddCode(fCodes, fValues, fLastCode, value, [](const double& key) { return key; });
}

double BINCatNumEncoder::EncodeConst(double value) const
{
    return IsMissing(value) ? kMissingCode : FindCode(fCodes, value);
}

double BINCatNumEncoder::Decode(int code) const
{
    return code >= 0 && code < GetNumberOfCategories() ? fValues[static_cast<std::size_t>(code)] : MCMV::gMissingValue;
}

bool BINCatNumEncoder::IsMissing(double value) const
{
    // A NaN has no place in the order of the map: it would pass for a category that is there, whichever comes first.
    if (value == MCMV::gMissingValue || std::isnan(value))
        return true;
    return fUserMissing && static_cast<const BINNumericUserMissing&>(*fUserMissing).Contains(value);
}
