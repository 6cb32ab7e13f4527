#include <mcobnqrt/bincatvar.h>

#include <mcobnqrt/bincatnumencoder.h>
#include <mcobnqrt/binstringencoder.h>

#include "metadata/metadataprinters.h"
#include "metadata/ownership.h"

#include <ostream>

namespace
{

std::unique_ptr<IBINEncoder> MakeEncoder(IBINVariable::MeasureLevel level, int expectedCategories)
{
    if (level == IBINVariable::MeasureNumericCategorical)
        return std::make_unique<BINCatNumEncoder>(expectedCategories);
    return std::make_unique<BINStringEncoder>(expectedCategories);
}

} // namespace

BINCatVar::BINCatVar(const std::string& name, const std::string& label, int numberOfCategories, MeasureLevel level,
                     VariableRole role)
    : BINVariable(name, label, role), fNCategories(numberOfCategories), fMeasureLevel(level),
      fEncoder(MakeEncoder(level, numberOfCategories))
{
}

BINCatVar::BINCatVar(const BINCatVar& other)
    : BINVariable(other), fNCategories(other.fNCategories), fMeasureLevel(other.fMeasureLevel),
      fEncoder(CloneOf(other.fEncoder))
{
}

BINCatVar& BINCatVar::operator=(const BINCatVar& other)
{
    if (this == &other)
        return *this;
    // The copy is made first, so that a failure doesn't leave a mixture of two variables.
    BINCatVar copy(other);
    SwapVariable(copy);
    fNCategories = copy.fNCategories;
    fMeasureLevel = copy.fMeasureLevel;
    fEncoder.swap(copy.fEncoder);
    return *this;
}

BINCatVar::~BINCatVar() = default;

IBINVariable::MeasureLevel BINCatVar::GetMeasureLevel() const
{
    return fMeasureLevel;
}

int BINCatVar::GetNumberOfCategories() const
{
    return fNCategories;
}

int BINCatVar::UpdateNumberOfCategories()
{
    if (fEncoder->GetNumberOfCategories() > fNCategories)
        fNCategories = fEncoder->GetNumberOfCategories();
    return fNCategories;
}

bool BINCatVar::SetUserMissingInfo(IBINUserMissing* userMissing)
{
    return fEncoder->SetUserMissingInfo(userMissing);
}

IBINUserMissing* BINCatVar::GetUserMissingInfo() const
{
    return fEncoder->GetUserMissingInfo();
}

IBINVariable* BINCatVar::Clone() const
{
    return std::make_unique<BINCatVar>(*this).release();
}

IBINEncoder* BINCatVar::GetEncoder()
{
    return fEncoder.get();
}

const IBINEncoder* BINCatVar::GetEncoder() const
{
    return fEncoder.get();
}

IBINVariable::VarStatus BINCatVar::GetVarStatus()
{
    const int numberOfCategories = UpdateNumberOfCategories();
    if (numberOfCategories == 1)
        return VarStatusOneCategory;
    return numberOfCategories > 0 ? VarStatusOK : VarStatusNoCategories;
}

void BINCatVar::Display(std::ostream& os) const
{
    os << "Categorical variable: name = " << GetVariableName() << ", label = " << GetVariableLabel() << ", role = ";
    DisplayVariableRole(os, GetVariableRole());
    os << "\tMeasurement Level = ";
    DisplayMeasureLevel(os, fMeasureLevel);
    os << "\tNumber of Categories = " << fNCategories << std::endl;
    fEncoder->Display(os);
}

void BINCatVar::SetNumberOfCategories(int numberOfCategories)
{
    fNCategories = numberOfCategories;
}
