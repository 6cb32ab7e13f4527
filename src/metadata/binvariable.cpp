#include <mcobnqrt/binvariable.h>

#include "metadata/nameindex.h"

#include <utility>

BINVariable::BINVariable(const std::string& name, const std::string& label, VariableRole role)
    : fName(name), fLabel(label), fRole(role)
{
}

BINVariable::BINVariable(const BINVariable& other) = default;

BINVariable::~BINVariable() = default;

std::string BINVariable::GetVariableName() const
{
    return fName;
}

std::string BINVariable::GetVariableLabel() const
{
    return fLabel;
}

void BINVariable::SetVariableLabel(const std::string& label)
{
    fLabel = label;
}

IBINVariable::VariableRole BINVariable::GetVariableRole() const
{
    return fRole;
}

void BINVariable::SetVariableRole(VariableRole role)
{
    fRole = role;
}

void BINVariable::SwapVariable(BINVariable& other)
{
    if (fName != other.fName)
        NoteNameChange();
    fName.swap(other.fName);
    fLabel.swap(other.fLabel);
    std::swap(fRole, other.fRole);
}
