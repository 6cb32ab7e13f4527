#include <mcobnqrt/binstringencoder.h>

#include <mcobnqrt/binstringusermissing.h>

#include "metadata/categorycodes.h"
#include "metadata/ownership.h"

#include <cstddef>
#include <ostream>

BINStringEncoder::BINStringEncoder(int expectedCategories)
{
    fLinks.reserve(static_cast<std::size_t>(expectedCategories));
}

BINStringEncoder::BINStringEncoder(const std::vector<std::string>& values)
{
    for (const std::string& value : values) Encode(value);
}

BINStringEncoder::BINStringEncoder(const BINStringEncoder& other)
    : IBINEncoder(other), fCodes(other.fCodes), fValueLabels(other.fValueLabels), fLastCode(other.fLastCode),
      fUserMissing(CloneOf(other.fUserMissing))
{
    CreateLinks();
}

BINStringEncoder& BINStringEncoder::operator=(const BINStringEncoder& other)
{
    if (this == &other)
        return *this;
    // The copy is made first, so that a failure doesn't leave the map and the table at odds. The swap takes the map's
    // nodes along, so the copy's links stay good.
    BINStringEncoder copy(other);
    fCodes.swap(copy.fCodes);
    fLinks.swap(copy.fLinks);
    fValueLabels.swap(copy.fValueLabels);
    fLastCode = copy.fLastCode;
    fUserMissing.swap(copy.fUserMissing);
    return *this;
}

BINStringEncoder::~BINStringEncoder() = default;

IBINEncoder::EncoderType BINStringEncoder::GetEncoderType() const
{
    return EncoderTypeString;
}

int BINStringEncoder::GetNumberOfCategories() const
{
    return fLastCode + 1;
}

void BINStringEncoder::SetValueLabels(const std::vector<std::string>& labels)
{
    ReplaceLabels(fValueLabels, labels);
}

void BINStringEncoder::SetValueLabel(int code, const std::string& label)
{
    StoreLabel(fValueLabels, GetNumberOfCategories(), code, label);
}

const std::vector<std::string>* BINStringEncoder::GetValueLabels() const
{
    return &fValueLabels;
}

bool BINStringEncoder::SetUserMissingInfo(IBINUserMissing* userMissing)
{
    return AdoptUserMissing(fUserMissing, userMissing, IBINUserMissing::DataTypeString);
}

IBINUserMissing* BINStringEncoder::GetUserMissingInfo() const
{
    return fUserMissing.get();
}

IBINEncoder* BINStringEncoder::Clone() const
{
    return std::make_unique<BINStringEncoder>(*this).release();
}

void BINStringEncoder::Display(std::ostream& os) const
{
    os << "\tBINStringEncoder object:  Last code = " << fLastCode << std::endl;
    for (std::size_t i = 0; i < fLinks.size(); ++i)
    {
        os << "\t\t" << i << "\t\t";
        if (fLinks[i])
            os << *fLinks[i] << std::endl;
        else
            os << "ERROR\n";
    }
    DisplayUserMissingOfEncoder(os, fUserMissing.get());
}

double BINStringEncoder::Encode(const std::string& value)
{
    if (IsMissing(value))
        return kMissingCode;
    return FindOrAddCode(fCodes, fLinks, fLastCode, value, [](const std::string& key) { return &key; });
}

double BINStringEncoder::EncodeConst(const std::string& value) const
{
    return IsMissing(value) ? kMissingCode : FindCode(fCodes, value);
}

std::string BINStringEncoder::Decode(int code) const
{
    return code >= 0 && code <= fLastCode ? *fLinks[static_cast<std::size_t>(code)] : std::string();
}

bool BINStringEncoder::IsMissing(const std::string& value) const
{
    return fUserMissing && static_cast<const BINStringUserMissing&>(*fUserMissing).Contains(value);
}

/// Points the table at the keys of this object's own map.
void BINStringEncoder::CreateLinks()
{
    fLinks.assign(fCodes.size(), nullptr);
    for (const auto& [value, code] : fCodes) fLinks[static_cast<std::size_t>(code)] = &value;
}
