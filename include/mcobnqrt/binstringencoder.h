#ifndef MCOBNQRT_BINSTRINGENCODER_H
#define MCOBNQRT_BINSTRINGENCODER_H

#include <mcobnqrt/export.h>
#include <mcobnqrt/ibinencoder.h>

#include <iosfwd>
#include <map>
#include <memory>
#include <string>
#include <vector>

/// Gives codes to categories that are strings, compared byte by byte. A category never goes away, and there is no limit
/// on their number here; a run takes codes up to 255.
class MCOBNQRT_EXPORT BINStringEncoder : public IBINEncoder
{
public:
    /// No categories yet, but room for `expectedCategories`. \throw std::length_error if no vector can hold that many,
    /// as with a negative number.
    BINStringEncoder(int expectedCategories = 2);

    /// Encodes `values` one after the other.
    BINStringEncoder(const std::vector<std::string>& values);

    BINStringEncoder(const BINStringEncoder& other);
    BINStringEncoder& operator=(const BINStringEncoder& other);
    ~BINStringEncoder() override;

    EncoderType GetEncoderType() const override;
    int GetNumberOfCategories() const override;
    void SetValueLabels(const std::vector<std::string>& labels) override;
    void SetValueLabel(int code, const std::string& label) override;
    const std::vector<std::string>* GetValueLabels() const override;

    /// Takes a BINStringUserMissing, and owns it.
    bool SetUserMissingInfo(IBINUserMissing* userMissing) override;

    IBINUserMissing* GetUserMissingInfo() const override;
    IBINEncoder* Clone() const override;
    void Display(std::ostream& os) const override;

    /// The code of `value`; a value not seen before becomes a category with the next code. -1.0, and no category, for a
    /// user-missing value. The empty string is a string like any other.
    double Encode(const std::string& value);

    /// The code of `value`, or -1.0 if it is user-missing or no category.
    double EncodeConst(const std::string& value) const;

    /// The value that has this code, or an empty string if none has.
    std::string Decode(int code) const;

private:
    bool IsMissing(const std::string& value) const;
    void CreateLinks();

    std::map<std::string, int> fCodes;
    std::vector<const std::string*> fLinks; ///< by code: the key in fCodes, which stays in place while the map grows
    std::vector<std::string> fValueLabels;
    int fLastCode = -1;                            ///< the codes are 0 to fLastCode, without a gap
    std::unique_ptr<IBINUserMissing> fUserMissing; ///< null or a BINStringUserMissing
};

#endif
