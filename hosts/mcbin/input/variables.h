#ifndef MCBIN_VARIABLES_H
#define MCBIN_VARIABLES_H

#include <mcobnqrt/binvarlist.h>

#include <cstddef>
#include <vector>

struct ColumnPlan;

/// The variables of an analysis: each column that takes part, with its categories coded in the order of their bytes, so
/// that the order of the rows makes no difference.
struct Variables
{
    BINVarList list;
    std::vector<std::size_t> columns; ///< by variable index: the place of its column in the table
    std::vector<int> pairAttributes;  ///< with a list of pairs: the variable indices of each; otherwise empty
    std::vector<int> pairTargets;
};

/// \throw Failure if there is no attribute, a categorical column has fewer than 2 categories, or missing values are
///        declared that a column can't have.
Variables MakeVariables(const ColumnPlan& plan);

#endif
