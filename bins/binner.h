#ifndef MCOBNQRT_BINS_BINNER_H
#define MCOBNQRT_BINS_BINNER_H

#include "bins/bins.h"
#include "bins/numberform.h"

#include <cstddef>
#include <optional>
#include <string>
#include <string_view>
#include <unordered_map>
#include <vector>

/// Puts the values of one attribute, as they stand in a text file, into its bins.
class Binner
{
public:
    struct Found
    {
        std::optional<std::size_t> bin; ///< from 0; nothing if the value is missing or bad
        bool isBad = false;             ///< no number where one should be, or a category never seen
        double value = 0.0;             ///< that is in the bin: the number, or the code of the category
    };

    /// `missingTexts` count as missing beside what the attribute declares; a number in them stands for all ways to
    /// write the number, where the attribute has numbers. `numbers` is how the values are written. `bins` must outlive
    /// the object.
    Binner(const AttributeBins& bins, const std::vector<std::string>& missingTexts, const NumberForm& numbers = {});

    Found Find(std::string_view field);

private:
    bool IsMissing(double value) const;
    Found FindCategory(std::string_view field);

    const AttributeBins& fBins;
    NumberForm fNumbers;
    std::vector<std::string> fMissingTexts;
    std::vector<double> fMissingNumbers; ///< the attribute's, and those among the texts
    std::unordered_map<std::string, Found> fFoundByCategory;
    Found fUnseen{std::nullopt, true, 0.0}; ///< of a category that is not among them
    std::string fKey;                       ///< kept for its memory
};

#endif
