#include <mcobnqrt/binroundencoder.h>

#include <mcobnqrt/binnumericusermissing.h>
#include <mcobnqrt/mccommon.h>

#include "metadata/categorycodes.h"
#include "metadata/metadataprinters.h"

#include <cmath>
#include <memory>
#include <ostream>

BINRoundEncoder::BINRoundEncoder() : BINRoundEncoder(IBINVariable::RoundClosest) {}

BINRoundEncoder::BINRoundEncoder(IBINVariable::BINWRoundingOption option) : fOption(option), fUserMissing(nullptr) {}

BINRoundEncoder::BINRoundEncoder(const BINRoundEncoder& other) = default;

BINRoundEncoder& BINRoundEncoder::operator=(const BINRoundEncoder& other) = default;

BINRoundEncoder::~BINRoundEncoder() = default;

IBINEncoder::EncoderType BINRoundEncoder::GetEncoderType() const
{
    return EncoderTypeRound;
}

int BINRoundEncoder::GetNumberOfCategories() const
{
    return 0;
}

void BINRoundEncoder::SetValueLabels(const std::vector<std::string>&) {}

void BINRoundEncoder::SetValueLabel(int, const std::string&) {}

const std::vector<std::string>* BINRoundEncoder::GetValueLabels() const
{
    return nullptr;
}

bool BINRoundEncoder::SetUserMissingInfo(IBINUserMissing* userMissing)
{
    if (userMissing && userMissing->GetDataType() != IBINUserMissing::DataTypeNumeric)
        return false;
    fUserMissing = userMissing;
    return true;
}

IBINUserMissing* BINRoundEncoder::GetUserMissingInfo() const
{
    return fUserMissing;
}

IBINEncoder* BINRoundEncoder::Clone() const
{
    return std::make_unique<BINRoundEncoder>(*this).release();
}

void BINRoundEncoder::Display(std::ostream& os) const
{
    os << "\tBINRoundEncoder: option = ";
    DisplayRoundingOption(os, fOption);
    DisplayUserMissingOfEncoder(os, fUserMissing);
    os << std::endl;
}

double BINRoundEncoder::Encode(double weight) const
{
    if (weight == MCMV::gMissingValue)
        return MCMV::gMissingValue;
    if (fUserMissing && static_cast<const BINNumericUserMissing*>(fUserMissing)->Contains(weight))
        return MCMV::gMissingValue;
    // A NaN isn't above 0 either: as a weight it is missing.
    const double rounded = Round(weight);
    return rounded > 0 ? rounded : MCMV::gMissingValue;
}

double BINRoundEncoder::Round(double weight) const
{
    switch (fOption)
    {
    case IBINVariable::RoundTruncate:
        return std::floor(weight);
    case IBINVariable::RoundClosest:
        return std::floor(weight + 0.5);
    default:
        return weight;
    }
}
