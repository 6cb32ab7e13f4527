#ifndef MCOBNQRT_BINVARIABLE_H
#define MCOBNQRT_BINVARIABLE_H

#include <mcobnqrt/export.h>
#include <mcobnqrt/ibinvariable.h>

#include <memory>
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

    /// Exchanges name, label and role with `other`. Both stay in their lists, which look their names up anew after
    /// that.
    void SwapVariable(BINVariable& other);

private:
    friend class BINVarList; // watches the names of its variables

    /// Has `*isRenamed` set when the variable gets another name: a host can assign one variable to another behind the
    /// back of the list that owns it. A copy of the variable is not watched.
    void WatchName(std::shared_ptr<bool> isRenamed);

    std::string fName;
    std::string fLabel;
    VariableRole fRole;
    std::shared_ptr<bool> fIsRenamed; ///< the watching list's, or null
};

#endif
