#ifndef MCBINNING_FIELD_H
#define MCBINNING_FIELD_H

#include "bins/bins.h"
#include "hosts/python/src/categorytable.h"
#include "hosts/python/src/columnreader.h"

#include <mcobnqrt/binnumericusermissing.h>
#include <mcobnqrt/binstringusermissing.h>

#include <cstdint>
#include <optional>
#include <string>
#include <utility>
#include <vector>

/// One field of the records: what it is for the analysis, where its values are, and which of them are missing.
struct Field
{
    enum class Use
    {
        kAttribute, ///< a number
        kCategory,  ///< a number or a text, which gets a code here
        kCode,      ///< a code already: that of one of the categories, which are all known
        kWeight
    };

    /// What a category is that is not among the known ones.
    enum class Unseen
    {
        kChanged, ///< an error: the data changed between two readings
        kError,   ///< an error: the bins were made without it
        kMissing, ///< a missing value
        kKept     ///< has the code behind all others, and its name is kept
    };

    std::string name;
    Use use = Use::kAttribute;
    /// What its numbers stand for, and of timestamps the zone that they are shown in.
    ValueKind valueKind = ValueKind::kNumber;
    std::string timeZone;

    /// The position of its column in the stream; -1 where it has an array.
    int column = -1;
    /// One value for each record of the whole data; borrowed.
    StridedArray array{};

    NumberCategories numbers; ///< by code where all categories are known
    TextCategories texts;
    /// All categories are known, and `unseen` tells what another one is.
    bool isComplete = false;
    Unseen unseen = Unseen::kChanged;
    std::vector<std::string> unseenNames; ///< the first few of the unseen categories that are kept

    /// More categories than a run takes are no error, but told by `hasTooMany`.
    bool isOptional = false;
    bool hasTooMany = false;
    std::int64_t numCoded = 0; ///< records with a category, once they have been read to learn of them

    /// The codes that the library takes, where they are others than those of `texts` in their order.
    struct Recoding
    {
        std::vector<std::string> names; ///< by code of the library
        std::vector<double> codes;      ///< the code of the library, by that in the order of `texts`
    };
    Recoding recoding;
    std::optional<RareCategories> rare;         ///< of the library's codes
    std::optional<std::size_t> unseenCode;      ///< what a category has that is not among the known ones
    std::optional<CategoryOrder> categoryOrder; ///< nothing for that which the column has
    std::string orderTarget;                    ///< the name of the target whose rates have ordered the categories

    /// Of a weight.
    WeightRounding rounding = WeightRounding::kNone;
    bool isScaledToRecords = false; ///< a weight

    BINNumericUserMissing missingNumbers;
    /// That of `missingNumbers` as it was declared: the library has the largest double for an infinite end.
    std::optional<std::pair<double, double>> missingInterval;
    BINStringUserMissing missingTexts;

    bool HasMissingNumbers() const { return missingNumbers.GetNDiscreteValues() > 0 || missingNumbers.HasInterval(); }

    std::size_t GetNumCategories() const
    {
        return recoding.names.empty() ? numbers.GetSize() + texts.GetSize() : recoding.names.size();
    }

    /// Of texts.
    CategoryOrder GetCategoryOrder() const
    {
        const bool isDeclared = !texts.GetDeclaredOrder().IsEmpty();
        return categoryOrder.value_or(isDeclared ? CategoryOrder::kDeclared : CategoryOrder::kText);
    }

    std::vector<std::size_t> GetRanks() const { return texts.GetSize() > 0 ? texts.GetRanks() : numbers.GetRanks(); }
};

#endif
