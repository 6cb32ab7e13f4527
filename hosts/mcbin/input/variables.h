#ifndef MCBIN_VARIABLES_H
#define MCBIN_VARIABLES_H

#include "bins/bins.h"
#include "hosts/mcbin/input/categories.h"

#include <mcobnqrt/binvarlist.h>

#include <cstddef>
#include <memory>
#include <vector>

struct ColumnPlan;

/// The variables of an analysis: each column that takes part.
struct Variables
{
    BINVarList list;
    std::vector<std::size_t> columns;                  ///< by variable index: the position of its column in the table
    std::vector<std::optional<Categories>> categories; ///< by variable index; nothing of one that has none
    std::vector<int> pairAttributes; ///< with a list of pairs: the variable indices of each; otherwise empty
    std::vector<int> pairTargets;
};

/// \throw Failure if there is no attribute, a categorical column has fewer than 2 categories, or missing values are
///        declared that a column can't have.
Variables MakeVariables(const ColumnPlan& plan);

/// What is told of the variables that have been made from `plan`, in their order.
std::vector<std::shared_ptr<const Variable>> DescribeVariables(const ColumnPlan& plan, const Variables& variables);

#endif
