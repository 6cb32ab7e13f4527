#include <mcobnqrt/bincontvar.h>

#include <mcobnqrt/ibinusermissing.h>

#include "metadata/metadataprinters.h"
#include "metadata/ownership.h"

#include <ostream>

BINContVar::BINContVar(const std::string& name, const std::string& label, VariableRole role)
    : BINVariable(name, label, role)
{
}

BINContVar::BINContVar(const BINContVar& other) : BINVariable(other), fUserMissing(CloneOf(other.fUserMissing)) {}

BINContVar& BINContVar::operator=(const BINContVar& other)
{
    if (this == &other)
        return *this;
    // The copy is made first, so that a failure doesn't leave a mixture of two variables.
    BINContVar copy(other);
    SwapVariable(copy);
    fUserMissing.swap(copy.fUserMissing);
    return *this;
}

BINContVar::~BINContVar() = default;

IBINVariable::MeasureLevel BINContVar::GetMeasureLevel() const
{
    return MeasureContinuous;
}

int BINContVar::UpdateNumberOfCategories()
{
    return 0;
}

bool BINContVar::SetUserMissingInfo(IBINUserMissing* userMissing)
{
    return AdoptUserMissing(fUserMissing, userMissing, IBINUserMissing::DataTypeNumeric);
}

IBINUserMissing* BINContVar::GetUserMissingInfo() const
{
    return fUserMissing.get();
}

IBINVariable* BINContVar::Clone() const
{
    return std::make_unique<BINContVar>(*this).release();
}

IBINVariable::VarStatus BINContVar::GetVarStatus()
{
    return VarStatusOK;
}

void BINContVar::Display(std::ostream& os) const
{
    os << "Continuous variable: name = " << GetVariableName() << ", label = " << GetVariableLabel() << ", role = ";
    DisplayVariableRole(os, GetVariableRole());
}

int BINContVar::GetNumberOfCategories() const
{
    return 0;
}

IBINEncoder* BINContVar::GetEncoder()
{
    return nullptr;
}

const IBINEncoder* BINContVar::GetEncoder() const
{
    return nullptr;
}
