#ifndef MCOBNQRT_BINCATVAR_H
#define MCOBNQRT_BINCATVAR_H

#include <mcobnqrt/binvariable.h>
#include <mcobnqrt/export.h>
#include <mcobnqrt/ibinencoder.h>

#include <iosfwd>
#include <memory>
#include <string>

/// A categorical variable. Its categories live in its encoder, and with them its user-missing values; the number of
/// categories that was declared lives beside it and need not agree.
class MCOBNQRT_EXPORT BINCatVar : public BINVariable
{
public:
    /// With MeasureNumericCategorical the variable has a BINCatNumEncoder, with every other level a BINStringEncoder;
    /// the encoder is empty in any case. \throw std::length_error if `numberOfCategories` is negative.
    BINCatVar(const std::string& name, const std::string& label, int numberOfCategories, MeasureLevel level,
              VariableRole role);

    BINCatVar(const BINCatVar& other);

    /// Replaces the encoder, too: a pointer to the old one dangles.
    BINCatVar& operator=(const BINCatVar& other);
    ~BINCatVar() override;

    MeasureLevel GetMeasureLevel() const override;
    int GetNumberOfCategories() const override;
    int UpdateNumberOfCategories() override;

    /// Hands the object on to the encoder, whose kind decides which data type is the right one.
    bool SetUserMissingInfo(IBINUserMissing* userMissing) override;

    IBINUserMissing* GetUserMissingInfo() const override;
    IBINVariable* Clone() const override;
    IBINEncoder* GetEncoder() override;
    const IBINEncoder* GetEncoder() const override;
    VarStatus GetVarStatus() override;
    void Display(std::ostream& os) const override;

    /// Overwrites the number of categories, whatever the encoder has seen.
    void SetNumberOfCategories(int numberOfCategories);

private:
    int fNCategories;
    MeasureLevel fMeasureLevel;
    std::unique_ptr<IBINEncoder> fEncoder; ///< never null
};

#endif
