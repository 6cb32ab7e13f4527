#ifndef MCOBNQRT_BINS_WEIGHTGRID_H
#define MCOBNQRT_BINS_WEIGHTGRID_H

#include <cstdint>
#include <optional>
#include <string_view>
#include <utility>

/// How a weight becomes a whole number, if it does.
enum class WeightRounding
{
    kNone,     ///< fractions count as they are
    kTruncate, ///< down to the whole number below
    kClosest   ///< to the closest whole number, halves up
};

/// "none", "truncate" or "closest".
const char* GetName(WeightRounding rounding);

/// Nothing if no rounding has the name.
std::optional<WeightRounding> FindWeightRounding(std::string_view name);

/// What the grid of the weights depends on. It is learnt from all records before the first of them is binned, and does
/// not depend on their order.
struct WeightTally
{
    WeightRounding rounding = WeightRounding::kNone;
    std::int64_t numPositive = 0; ///< records whose weight, rounded, is above 0
    double largest = 0.0;         ///< of the rounded weights
    double scale = 1.0;           ///< by which the rounded weights are multiplied before they are put on the grid

    /// `weight` is finite, not rounded yet, and not missing.
    void Add(double weight);

    /// Scales the weights to sum to the number of records whose weight is above 0, but for the last digits.
    /// \param total the sum of all weights on the grid that they have before they are scaled.
    void ScaleToRecords(double total);
};

/// Rounds weights so that every sum of them is exact, in whatever order it is made.
///
/// With n records whose weight is above 0, and a largest weight w, once they are scaled, the grid holds the multiples of
///
///     g = 2^(ceil(log2(n w)) - 52)
///
/// Then all weights together are less than 2^53 g, and so each partial sum, and each difference of two, is a multiple
/// of g that a double holds exactly. What subtracting leaves of a category that is gone is 0, and no residue such as
/// 1e-17 that would count as the category being present.
///
/// Whole numbers stay as they are as long as n w is at most 2^52, and multiples of 1/16 up to 2^48. Otherwise a weight
/// moves by g / 2 at most, which with a million records is less than one part in 10^9 of the largest weight; one below
/// g / 2 moves by less than g, as a weight above 0 never becomes 0.
class WeightGrid
{
public:
    /// The grid for the weights that were tallied. Without a positive weight among them no weight moves.
    explicit WeightGrid(const WeightTally& tally);

    /// The weight that the library is to count: rounded and scaled as the tally says, and then to the nearest multiple
    /// of g, of two equally near ones to the even one. `weight` is finite, at least 0, and one of those tallied.
    double Round(double weight);

    /// g, if a weight has moved because of it; nothing as long as all weights lay on the grid.
    std::optional<double> GetStep() const;

    /// g as the product of two powers of two, of which each has an inverse among the doubles.
    std::pair<double, double> GetFactors() const { return {fFactors[0], fFactors[1]}; }

private:
    WeightRounding fRounding;
    double fScale;
    // g as the product of two powers of two, which are in the middle of the range of doubles, and so are their
    // inverses.
    double fFactors[2];
    double fInverses[2];
    bool fHasMoved = false;
};

#endif
