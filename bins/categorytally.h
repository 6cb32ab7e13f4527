#ifndef MCOBNQRT_BINS_CATEGORYTALLY_H
#define MCOBNQRT_BINS_CATEGORYTALLY_H

#include "bins/bins.h"

#include <mcobnqrt/mccommon.h>

#include <cstddef>
#include <memory>
#include <optional>
#include <vector>

/// Adds up what each category of attributes weighs, by category of a target, in records as the library takes them. As
/// the weights lie on a grid, the order of the records makes no difference.
class CategoryTally
{
public:
    /// Indices of variables.
    struct Pair
    {
        int attribute;
        std::optional<int> target; ///< nothing without one
    };

    /// Of the pairs only those with a categorical attribute are counted.
    CategoryTally(const std::vector<std::shared_ptr<const Variable>>& variables, const std::vector<Pair>& pairs);

    bool IsEmpty() const { return fCounts.empty(); }

    /// The record counts if its weight is above 0, and for a pair, if it has a category of both.
    void Add(const MCCommon::Record& record);

    /// By code of the attribute, and there by code of the target, or a single weight without one. Null if the pair is
    /// not counted.
    const std::vector<std::vector<double>>* Find(const Pair& pair) const;

private:
    struct Count
    {
        Pair pair;
        std::vector<std::vector<double>> weights;
    };

    std::optional<int> fWeight; ///< the index of the weight
    std::vector<Count> fCounts;
};

/// The index of the weight, if a variable is one.
std::optional<int> FindWeight(const std::vector<std::shared_ptr<const Variable>>& variables);

/// The weight with which the library counts the record, of which `weight` is the field with it; 0 or less if it does not
/// count.
inline double GetWeight(const MCCommon::Record& record, std::optional<int> weight)
{
    return weight ? record[*weight] : 1.0;
}

#endif
