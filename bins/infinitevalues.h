#ifndef MCOBNQRT_BINS_INFINITEVALUES_H
#define MCOBNQRT_BINS_INFINITEVALUES_H

#include <cmath>
#include <limits>

// The library's bins end at the largest finite double of each sign, of which the negative one marks a missing value. So
// the hosts hand an infinity on as the next double towards 0, its stand-in, which fits a bin whichever side is closed.
// To stay below it, the finite doubles from the stand-in on become the next double below: the outermost three of the
// positive and of the negative ones count as one value, which is still finite. What the library gives back is turned
// round, so that comparing the values of the data with the cut points gives the bins that the library has counted.

/// The value as the library takes it. A NaN stays one.
double EncodeInfinity(double value);

/// What the value of the library stands for in the data, where the outermost finite doubles are all
/// 1.7976931348623157e308 with their sign.
double DecodeInfinity(double value);

/// The values of one attribute on their way to the library, and its cut points on their way back.
class InfiniteValues
{
public:
    /// The value, which is not a missing one, as the library takes it.
    double Encode(double value)
    {
        if (!(std::fabs(value) < kLargestAsItIs))
            return EncodeOuter(value);
        Note(value);
        return value;
    }

    /// The cut point that divides the values of the data as `cutPoint` divides those of the library.
    ///
    /// One between the last finite value and an infinity is the midpoint of the value and a stand-in for the library.
    /// As the midpoint of a number and an infinity is the infinity, it becomes the value that the closed side of the
    /// bin allows: the finite one or the infinity.
    double DecodeCutPoint(double cutPoint, bool isRightClosed) const;

private:
    static constexpr double kLargestAsItIs = 1.7976931348623153e308;

    double EncodeOuter(double value);

    void Note(double value)
    {
        fSmallest = value < fSmallest ? value : fSmallest;
        fLargest = value > fLargest ? value : fLargest;
    }

    // Of the finite values, as the library takes them.
    double fSmallest = std::numeric_limits<double>::infinity();
    double fLargest = -std::numeric_limits<double>::infinity();
    bool fHasNegative = false; ///< an infinity
    bool fHasPositive = false; ///< an infinity
};

#endif
