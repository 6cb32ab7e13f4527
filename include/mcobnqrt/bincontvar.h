#ifndef MCOBNQRT_BINCONTVAR_H
#define MCOBNQRT_BINCONTVAR_H

#include <mcobnqrt/binvariable.h>
#include <mcobnqrt/export.h>

#include <iosfwd>
#include <memory>
#include <string>

/// A continuous variable. It has neither categories nor an encoder.
class MCOBNQRT_EXPORT BINContVar : public BINVariable
{
public:
    BINContVar(const std::string& name, const std::string& label, VariableRole role);
    BINContVar(const BINContVar& other);
    BINContVar& operator=(const BINContVar& other);
    ~BINContVar() override;

    MeasureLevel GetMeasureLevel() const override;
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

    std::unique_ptr<IBINUserMissing> fUserMissing; ///< null or a BINNumericUserMissing
};

#endif
