#ifndef MCBIN_OUTCOME_H
#define MCBIN_OUTCOME_H

#include "bins/bins.h"

#include <string>
#include <vector>

/// What a run of the tool has to tell: the bins, and what stands beside them.
struct Outcome
{
    Bins bins;
    std::vector<std::string> leftOut; ///< columns of text, each with the reason and an example
    std::vector<std::string> notes;   ///< for the user
    bool areCategoriesShown = false;  ///< in tables: below the bins of a categorical attribute each of its categories
};

#endif
