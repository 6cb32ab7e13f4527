#ifndef MCOBNQRT_BINWEIGHTVAR_H
#define MCOBNQRT_BINWEIGHTVAR_H

#include <mcobnqrt/binroundencoder.h>
#include <mcobnqrt/binvariable.h>
#include <mcobnqrt/export.h>

#include <iosfwd>
#include <memory>
#include <string>

/// The frequency weight: how many cases a record stands for. Its level and its role are fixed.
class MCOBNQRT_EXPORT BINWeightVar : public BINVariable
{
public:
    BINWeightVar(const std::string& name, const std::string& label, BINWRoundingOption option);
    BINWeightVar(const BINWeightVar& other);

    /// Takes over the rounding option, too. The encoder object stays, and with it pointers to it.
    BINWeightVar& operator=(const BINWeightVar& other);
    ~BINWeightVar() override;

    MeasureLevel GetMeasureLevel() const override;
    int GetNumberOfCategories() const override;
    void SetVariableRole(VariableRole role) override; ///< Changes nothing: the role stays RoleFrequencyWeight.
    int UpdateNumberOfCategories() override;

    /// Takes a BINNumericUserMissing, which the encoder then borrows.
    bool SetUserMissingInfo(IBINUserMissing* userMissing) override;

    IBINUserMissing* GetUserMissingInfo() const override;
    IBINVariable* Clone() const override;
    IBINEncoder* GetEncoder() override;
    const IBINEncoder* GetEncoder() const override;
    VarStatus GetVarStatus() override;
    void Display(std::ostream& os) const override;

private:
    std::unique_ptr<BINRoundEncoder> fEncoder;     ///< never null
    std::unique_ptr<IBINUserMissing> fUserMissing; ///< null or a BINNumericUserMissing; fEncoder borrows it
};

#endif
