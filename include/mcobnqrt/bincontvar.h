#ifndef MCOBNQRT_BINCONTVAR_H
#define MCOBNQRT_BINCONTVAR_H

#include <mcobnqrt/export.h>
#include <mcobnqrt/ibinvariable.h>

#include <iosfwd>
#include <memory>
#include <string>

/// A continuous variable. It has neither categories nor an encoder.
class MCOBNQRT_EXPORT BINContVar : public IBINVariable
{
public:
    BINContVar(const std::string& name, const std::string& label, VariableRole role);
    BINContVar(const BINContVar& other);
    BINContVar& operator=(const BINContVar& other);
    ~BINContVar() override;

    MeasureLevel GetMeasureLevel() const override;
    std::string GetVariableName() const override;
    std::string GetVariableLabel() const override;
    void SetVariableLabel(const std::string& label) override;
    VariableRole GetVariableRole() const override;
    void SetVariableRole(VariableRole role) override;
    int UpdateNumberOfCategories() override;

    /// Takes a BINNumericUserMissing.
    bool SetUserMissingInfo(IBINUserMissing* userMissing) override;

    IBINUserMissing* GetUserMissingInfo() const override;
    IBINVariable* Clone() const override;
    VarStatus GetVarStatus() override;
    void Display(std::ostream& os) const override;

private:
    int GetNumberOfCategories() const override;
    IBINEncoder* GetEncoder() override;
    const IBINEncoder* GetEncoder() const override;

    std::string fName;
    std::string fLabel;
    VariableRole fRole;
    std::unique_ptr<IBINUserMissing> fUserMissing; ///< null or a BINNumericUserMissing
};

#endif
