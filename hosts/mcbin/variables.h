#ifndef MCBIN_VARIABLES_H
#define MCBIN_VARIABLES_H

#include <mcobnqrt/binvarlist.h>

#include <cstddef>
#include <vector>

struct TableProfile;

/// The variables of an analysis: every numeric column as an attribute, and the target with its categories coded in the
/// order of their bytes, so that the order of the rows makes no difference. A column of other text is left out: its bins
/// would be runs of the alphabet.
struct Variables
{
    BINVarList list;
    std::vector<std::size_t> columns; ///< by variable index: the place of its column in the table
};

/// \throw Failure if there is no attribute, or the target has fewer than 2 categories.
Variables MakeVariables(const TableProfile& profile);

#endif
