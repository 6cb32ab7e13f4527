#ifndef MCOBNQRT_BINVARIABLE_H
#define MCOBNQRT_BINVARIABLE_H

#include <mcobnqrt/export.h>
#include <mcobnqrt/ibinvariable.h>

#include <string>

/// Holds what every variable has: name, label and role. The base of BINContVar, BINCatVar and BINWeightVar.
class MCOBNQRT_EXPORT BINVariable : public IBINVariable
{
public:
    ~BINVariable() override;
    BINVariable& operator=(const BINVariable&) = delete;

    std::string GetVariableName() const override;
    std::string GetVariableLabel() const override;
    void SetVariableLabel(const std::string& label) override;
    VariableRole GetVariableRole() const override;
    void SetVariableRole(VariableRole role) override;

protected:
    BINVariable(const std::string& name, const std::string& label, VariableRole role);
    BINVariable(const BINVariable& other);

    /// Exchanges name, label and role with `other`. Every variable list looks its names up anew after a change of name.
    void SwapVariable(BINVariable& other);

private:
    std::string fName;
    std::string fLabel;
    VariableRole fRole;
};

#endif
