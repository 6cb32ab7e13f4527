#include <mcobnqrt/binvariable.h>

#include <utility>

BINVariable::BINVariable(const std::string& name, const std::string& label, VariableRole role)
    : fName(name), fLabel(label), fRole(role)
{
}

BINVariable::BINVariable(const BINVariable& other)
    : IBINVariable(other), fName(other.fName), fLabel(other.fLabel), fRole(other.fRole)
{
}

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
    for (const BINVariable* variable : {this, &other})
    {
        if (variable->fIsRenamed != nullptr && fName != other.fName)
            *variable->fIsRenamed = true;
    }
    fName.swap(other.fName);
    fLabel.swap(other.fLabel);
    std::swap(fRole, other.fRole);
}

void BINVariable::WatchName(std::shared_ptr<bool> isRenamed)
{
    fIsRenamed = std::move(isRenamed);
}
