#ifndef MCOBNQRT_BINCATNUMENCODER_H
#define MCOBNQRT_BINCATNUMENCODER_H

#include <mcobnqrt/export.h>
#include <mcobnqrt/ibinencoder.h>

#include <iosfwd>
#include <map>
#include <memory>
#include <string>
#include <vector>

/// Gives codes to categories that are numbers. A category never goes away, and there is no limit on their number here;
/// a run takes codes up to 255.
class MCOBNQRT_EXPORT BINCatNumEncoder : public IBINEncoder
{
public:
    /// No categories yet, but room for `expectedCategories`. \throw std::length_error if no vector can hold that many,
    /// as with a negative number.
    BINCatNumEncoder(int expectedCategories = 2);

    /// Encodes `values` one after the other.
    BINCatNumEncoder(const std::vector<double>& values);

    BINCatNumEncoder(const BINCatNumEncoder& other);
    BINCatNumEncoder& operator=(const BINCatNumEncoder& other);
    ~BINCatNumEncoder() override;

    EncoderType GetEncoderType() const override;
    int GetNumberOfCategories() const override;
    void SetValueLabels(const std::vector<std::string>& labels) override;
    void SetValueLabel(int code, const std::string& label) override;
    const std::vector<std::string>* GetValueLabels() const override;

    /// Takes a BINNumericUserMissing, and owns it.
    bool SetUserMissingInfo(IBINUserMissing* userMissing) override;

    IBINUserMissing* GetUserMissingInfo() const override;
    IBINEncoder* Clone() const override;
    void Display(std::ostream& os) const override;

    /// The code of `value`; a value not seen before becomes a category with the next code. -1.0, and no category, for
    /// MCMV::gMissingValue, a NaN and a user-missing value.
    double Encode(double value);

    /// The code of `value`, or -1.0 if it is missing, as for Encode, or no category.
    double EncodeConst(double value) const;

    /// The value that has this code, or MCMV::gMissingValue if none has.
    double Decode(int code) const;

private:
    bool IsMissing(double value) const;

    std::map<double, int> fCodes;
    std::vector<double> fValues; ///< by code
    std::vector<std::string> fValueLabels;
    int fLastCode = -1;                            ///< the codes are 0 to fLastCode, without a gap
    std::unique_ptr<IBINUserMissing> fUserMissing; ///< null or a BINNumericUserMissing
};

#endif
