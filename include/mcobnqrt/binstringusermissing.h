#ifndef MCOBNQRT_BINSTRINGUSERMISSING_H
#define MCOBNQRT_BINSTRINGUSERMISSING_H

#include <mcobnqrt/export.h>
#include <mcobnqrt/ibinusermissing.h>

#include <iosfwd>
#include <string>
#include <vector>

/// User-missing strings: any number of single values, each with a label. There is no interval of strings.
class MCOBNQRT_EXPORT BINStringUserMissing : public IBINUserMissing
{
public:
    /// Declares nothing yet.
    BINStringUserMissing();
    BINStringUserMissing(const BINStringUserMissing& other);
    BINStringUserMissing& operator=(const BINStringUserMissing& other);
    ~BINStringUserMissing() override;

    DataType GetDataType() const override;
    int GetNDiscreteValues() const override;
    bool HasInterval() const override;
    IBINUserMissing* Clone() const override;
    bool IsEqualTo(const IBINUserMissing* other) const override;
    void Display(std::ostream& os) const override;

    /// Adds a value. One that is there already stands twice then, and counts twice.
    void AddValue(const std::string& value, const std::string& label);

    /// Whether `value` equals one of the values, byte by byte.
    bool Contains(const std::string& value) const;

    /// The values and their labels, both in the order of adding.
    const std::vector<std::string>& GetDiscreteValues() const { return fValues; }
    const std::vector<std::string>& GetValueLabels() const { return fLabels; }

private:
    std::vector<std::string> fValues;
    std::vector<std::string> fLabels; ///< one for each of fValues
};

#endif
