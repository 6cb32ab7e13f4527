#include <mcobnqrt/binweightvar.h>

#include <mcobnqrt/ibinusermissing.h>

#include "metadata/ownership.h"

#include <ostream>

BINWeightVar::BINWeightVar(const std::string& name, const std::string& label, BINWRoundingOption option)
    : BINVariable(name, label, RoleFrequencyWeight), fEncoder(std::make_unique<BINRoundEncoder>(option))
{
}

BINWeightVar::BINWeightVar(const BINWeightVar& other)
    : BINVariable(other), fEncoder(std::make_unique<BINRoundEncoder>(*other.fEncoder)),
      fUserMissing(CloneOf(other.fUserMissing))
{
    // The copied encoder still borrows from the source.
    fEncoder->SetUserMissingInfo(fUserMissing.get());
}

BINWeightVar& BINWeightVar::operator=(const BINWeightVar& other)
{
    if (this == &other)
        return *this;
    // The copy is made first, so that a failure doesn't leave a mixture of two variables.
    BINWeightVar copy(other);
    SwapVariable(copy);
    fUserMissing.swap(copy.fUserMissing);
    *fEncoder = *copy.fEncoder; // borrows what is now this object's
    return *this;
}

BINWeightVar::~BINWeightVar() = default;

IBINVariable::MeasureLevel BINWeightVar::GetMeasureLevel() const
{
    return MeasureFrequencyWeight;
}

int BINWeightVar::GetNumberOfCategories() const
{
    return 0;
}

void BINWeightVar::SetVariableRole(VariableRole) {}

int BINWeightVar::UpdateNumberOfCategories()
{
    return 0;
}

bool BINWeightVar::SetUserMissingInfo(IBINUserMissing* userMissing)
{
    return AdoptUserMissing(fUserMissing, userMissing, IBINUserMissing::DataTypeNumeric) &&
           fEncoder->SetUserMissingInfo(fUserMissing.get());
}

IBINUserMissing* BINWeightVar::GetUserMissingInfo() const
{
    return fUserMissing.get();
}

IBINVariable* BINWeightVar::Clone() const
{
    return std::make_unique<BINWeightVar>(*this).release();
}

IBINEncoder* BINWeightVar::GetEncoder()
{
    return fEncoder.get();
}

const IBINEncoder* BINWeightVar::GetEncoder() const
{
    return fEncoder.get();
}

IBINVariable::VarStatus BINWeightVar::GetVarStatus()
{
    return VarStatusOK;
}

void BINWeightVar::Display(std::ostream& os) const
{
    os << "Frequency weight variable: name = " << GetVariableName() << ", label = " << GetVariableLabel() << std::endl;
    fEncoder->Display(os);
    if (fUserMissing)
        fUserMissing->Display(os);
}
