#ifndef MCOBNQRT_BINS_ROWS_H
#define MCOBNQRT_BINS_ROWS_H

#include "bins/bins.h"
#include "bins/measures.h"

#include <optional>
#include <string>
#include <vector>

/// A row of each table of bins, whoever prints it.
struct BinRow
{
    enum class Kind
    {
        kBin,
        kMissing, ///< the records without a valid value
        kUnseen,  ///< those of a category that the bins were made without
        kTotal
    };

    Kind kind = Kind::kBin;
    std::string label;
    Bin bin;
    double share = 0.0; ///< of the total
    /// Of the second category of two, where there is any; of the total the rate and the information value.
    std::optional<Evidence> evidence;
    /// Of each category of more than two against all others; empty of other targets.
    std::vector<std::optional<Evidence>> evidenceByCategory;
};

/// The same result with a bin for each category of a categorical attribute, in the order of the codes: what was grouped,
/// one by one. Without bins where the categories are not known.
AttributeBins SplitByCategory(const AttributeBins& bins);

/// The bins, the missing if they have weight, and the total. Empty without bins.
std::vector<BinRow> MakeRows(const AttributeBins& bins);

#endif
