#ifndef MCBINNING_COUNTING_H
#define MCBINNING_COUNTING_H

#include "bins/evaluation.h"
#include "bins/weightgrid.h"
#include "hosts/python/src/blocks.h"
#include "hosts/python/src/field.h"

#include <cstddef>
#include <optional>
#include <vector>

/// What is to be counted: a result, and the fields that have its values and its categories.
struct Counted
{
    std::size_t result;
    std::size_t attribute;
    std::optional<std::size_t> target;
};

/// Counts all records in the bins of `first`. Its categories are those of the fields, by code; a field that keeps unseen
/// categories tells their names.
/// \param grid for the weights, if a field has them.
/// \param areGroups whether records are groups of equal bins: one that weighs 0 has a further value of a group.
Evaluation CountRecords(Bins first, const std::vector<Counted>& counted, BlockSource& source,
                        const std::vector<Field>& fields, WeightGrid grid, bool areGroups);

#endif
