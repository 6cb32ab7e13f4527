#ifndef MCOBNQRT_BINNUMERICINTERVAL_H
#define MCOBNQRT_BINNUMERICINTERVAL_H

#include <mcobnqrt/export.h>

#include <iosfwd>

/// A closed interval of numbers: both ends belong to it, a finite end beside an infinite one too.
///
/// An infinite end is held as the largest finite double, with its sign, and not as an IEEE infinity; a number of that
/// size therefore lies in the interval. The ends may be in the wrong order: the interval is empty then.
class MCOBNQRT_EXPORT BINNumericInterval
{
public:
    /// The one-point interval [0, 0].
    BINNumericInterval();

    /// The interval from `left` to `right`, in whatever order they are.
    BINNumericInterval(double left, double right);

    /// The half-infinite interval up to `end` if `leftInfinite`, from `end` upwards if not.
    BINNumericInterval(double end, bool leftInfinite);

    /// A NaN lies in no interval.
    bool Contains(double value) const;
    bool IsEmpty() const;
    bool operator==(const BINNumericInterval& other) const;

    /// Sets an end, in any case. \return whether the ends are now in order; equal ends are.
    bool SetLeftEnd(double value);
    bool SetRightEnd(double value);

    double GetLeftEnd() const { return fLeftEnd; }
    double GetRightEnd() const { return fRightEnd; }
    bool IsLeftEndInfinite() const;
    bool IsRightEndInfinite() const;

    /// Writes one line, such as "BINNumericInterval: [ 1, infinity )".
    void Display(std::ostream& os) const;

private:
    double fLeftEnd;
    double fRightEnd;
};

#endif
