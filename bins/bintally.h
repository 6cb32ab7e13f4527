#ifndef MCOBNQRT_BINS_BINTALLY_H
#define MCOBNQRT_BINS_BINTALLY_H

#include "bins/binner.h"
#include "bins/bins.h"

#include <algorithm>
#include <cstddef>
#include <limits>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

/// Of records that were counted in bins: what does not fit these bins.
struct Strangers
{
    Bin unseen;                                ///< whose category the bins were made without; it has no borders
    std::vector<std::string> unseenCategories; ///< the first few of these, as they came
    double below = 0.0;                        ///< weight of the values below the least that the bins were made of
    double above = 0.0;                        ///< weight of the values above the largest
};

/// What values lie between; no value if it is empty.
struct ValueRange
{
    double least = std::numeric_limits<double>::infinity();
    double largest = -std::numeric_limits<double>::infinity();

    bool IsEmpty() const { return least > largest; }

    void Add(double value) { Add({value, value}); }

    void Add(const ValueRange& other)
    {
        least = std::min(least, other.least);
        largest = std::max(largest, other.largest);
    }
};

/// Counts records in bins that are there already.
class BinTally
{
public:
    /// \param bins stays the caller's and outlives the object. Its weights are not looked at.
    /// \param hasTarget whether the records have a category of the target of `bins`.
    BinTally(const AttributeBins& bins, bool hasTarget);

    /// Counts one record.
    /// \param found where its value belongs.
    /// \param code of its category; nothing if that is missing, or not known. Not looked at without a target.
    /// \param weight above 0, and one of those whose sums are exact.
    void Add(const Binner::Found& found, std::optional<std::size_t> code, double weight);

    /// Takes in a value of records that have been counted with another one of their bin.
    void Widen(const Binner::Found& found, std::optional<std::size_t> code);

    /// Tells of a category that the bins were made without. After some it does nothing.
    void NameUnseen(std::string_view category);

    /// The bins with what was counted.
    AttributeBins GetBins() const;

    const Strangers& GetStrangers() const { return fStrangers; }

    /// By bin: the values of all records, those without a category among them.
    const std::vector<ValueRange>& GetRanges() const { return fRanges; }

private:
    void AddValue(double value, double weight);

    const AttributeBins& fKnown;
    AttributeBins fBins; ///< counted
    Strangers fStrangers;
    std::vector<ValueRange> fRanges;
    bool fHasTarget;
};

#endif
