#ifndef MCOBNQRT_IBINUSERMISSING_H
#define MCOBNQRT_IBINUSERMISSING_H

#include <mcobnqrt/export.h>

#include <iosfwd>

/// The values of one variable that count as missing although they are ordinary numbers or strings.
///
/// Contains of the concrete class tells whether a value is one of them, and GetDataType which class that is.
/// The system-missing MCMV::gMissingValue is a thing apart, and no object of these classes knows it.
class MCOBNQRT_EXPORT IBINUserMissing
{
public:
    enum DataType : int
    {
        DataTypeNumeric = 0, ///< the object is a BINNumericUserMissing
        DataTypeString = 1   ///< the object is a BINStringUserMissing
    };

    IBINUserMissing() = default;
    IBINUserMissing(const IBINUserMissing&) = default;
    IBINUserMissing& operator=(const IBINUserMissing&) = default;
    virtual ~IBINUserMissing() = default;

    virtual DataType GetDataType() const = 0;
    virtual int GetNDiscreteValues() const = 0;
    virtual bool HasInterval() const = 0;

    /// \return a new deep copy, which the caller owns.
    virtual IBINUserMissing* Clone() const = 0;

    /// Whether `other` is of the same data type and declares the same values in the same order, and the same interval.
    /// Labels don't matter. False if `other` is null.
    virtual bool IsEqualTo(const IBINUserMissing* other) const = 0;

    /// Writes the values and the interval, line by line, for the programmer's eye.
    virtual void Display(std::ostream& os) const = 0;
};

#endif
