#ifndef MCOBNQRT_BINROUNDENCODER_H
#define MCOBNQRT_BINROUNDENCODER_H

#include <mcobnqrt/export.h>
#include <mcobnqrt/ibinencoder.h>
#include <mcobnqrt/ibinvariable.h>

#include <iosfwd>
#include <string>
#include <vector>

/// Rounds the frequency weight of a record. It has no categories and no labels.
class MCOBNQRT_EXPORT BINRoundEncoder : public IBINEncoder
{
public:
    /// Rounds to the closest whole number.
    BINRoundEncoder();
    BINRoundEncoder(IBINVariable::BINWRoundingOption option);

    /// A copy borrows the same user-missing object.
    BINRoundEncoder(const BINRoundEncoder& other);
    BINRoundEncoder& operator=(const BINRoundEncoder& other);
    ~BINRoundEncoder() override;

    EncoderType GetEncoderType() const override;
    int GetNumberOfCategories() const override;
    void SetValueLabels(const std::vector<std::string>& labels) override;
    void SetValueLabel(int code, const std::string& label) override;
    const std::vector<std::string>* GetValueLabels() const override;

    /// Takes a BINNumericUserMissing, and only borrows it: it must outlive this encoder or its next call.
    bool SetUserMissingInfo(IBINUserMissing* userMissing) override;

    IBINUserMissing* GetUserMissingInfo() const override;
    IBINEncoder* Clone() const override;
    void Display(std::ostream& os) const override;

    /// The rounded weight; halves go up with RoundClosest. MCMV::gMissingValue if the weight is that or user-missing,
    /// or if it isn't above 0 after rounding.
    double Encode(double weight) const;

private:
    double Round(double weight) const;

    IBINVariable::BINWRoundingOption fOption;
    IBINUserMissing* fUserMissing; ///< null or a BINNumericUserMissing; not owned, the weight variable's
};

#endif
