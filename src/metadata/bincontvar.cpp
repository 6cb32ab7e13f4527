#include <mcobnqrt/bincontvar.h>

#include <mcobnqrt/ibinusermissing.h>

#include "metadata/metadataprinters.h"
#include "metadata/nameindex.h"
#include "metadata/ownership.h"

#include <ostream>

BINContVar::BINContVar(const std::string& name, const std::string& label, VariableRole role)
    : fName(name), fLabel(label), fRole(role)
{
}

BINContVar::BINContVar(const BINContVar& other)
    : IBINVariable(other), fName(other.fName), fLabel(other.fLabel), fRole(other.fRole),
      fUserMissing(CloneOf(other.fUserMissing))
{
}

BINContVar& BINContVar::operator=(const BINContVar& other)
{
    if (this == &other)
        return *this;
    // Copied first: what can fail must not leave a mixture of two variables.
    BINContVar copy(other);
    if (fName != copy.fName)
        NoteNameChange();
    fName.swap(copy.fName);
    fLabel.swap(copy.fLabel);
    fRole = copy.fRole;
    fUserMissing.swap(copy.fUserMissing);
    return *this;
}

BINContVar::~BINContVar() = default;

IBINVariable::MeasureLevel BINContVar::GetMeasureLevel() const
{
    return MeasureContinuous;
}

std::string BINContVar::GetVariableName() const
{
    return fName;
}

std::string BINContVar::GetVariableLabel() const
{
    return fLabel;
}

void BINContVar::SetVariableLabel(const std::string& label)
{
    fLabel = label;
}

IBINVariable::VariableRole BINContVar::GetVariableRole() const
{
    return fRole;
}

void BINContVar::SetVariableRole(VariableRole role)
{
    fRole = role;
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
    os << "Continuous variable: name = " << fName << ", label = " << fLabel << ", role = ";
    DisplayVariableRole(os, fRole);
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
