#ifndef MCOBNQRT_BINNUMERICUSERMISSING_H
#define MCOBNQRT_BINNUMERICUSERMISSING_H

#include <mcobnqrt/binnumericinterval.h>
#include <mcobnqrt/export.h>
#include <mcobnqrt/ibinusermissing.h>

#include <iosfwd>
#include <string>
#include <vector>

/// User-missing numbers: any number of single values, each with a label, and at most one interval beside them.
class MCOBNQRT_EXPORT BINNumericUserMissing : public IBINUserMissing
{
public:
    /// Declares nothing yet.
    BINNumericUserMissing();
    BINNumericUserMissing(const BINNumericUserMissing& other);
    BINNumericUserMissing& operator=(const BINNumericUserMissing& other);
    ~BINNumericUserMissing() override;

    DataType GetDataType() const override;
    int GetNDiscreteValues() const override;
    bool HasInterval() const override;
    IBINUserMissing* Clone() const override;
    bool IsEqualTo(const IBINUserMissing* other) const override;
    void Display(std::ostream& os) const override;

    /// Adds a single value. One that is there already stands twice then, and counts twice.
    void AddValue(double value, const std::string& label);

    /// Sets the interval; an earlier one is replaced.
    void SetInterval(const BINNumericInterval& interval);

    /// Whether `value` equals one of the single values, without tolerance, or lies in the interval.
    bool Contains(double value) const;

    /// The interval, which stays this object's, or null if none was set.
    const BINNumericInterval* GetInterval() const;

    /// The single values and their labels, both in the order of adding.
    const std::vector<double>& GetDiscreteValues() const { return fValues; }
    const std::vector<std::string>& GetValueLabels() const { return fLabels; }

private:
    std::vector<double> fValues;
    std::vector<std::string> fLabels; ///< one for each of fValues
    BINNumericInterval fInterval;     ///< means something only if fHasInterval
    bool fHasInterval = false;
};

#endif
