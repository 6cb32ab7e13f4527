#ifndef MCOBNQRT_TUPLESORT_H
#define MCOBNQRT_TUPLESORT_H

#include "data/binsorttuple.h"
#include "data/binvaluetuple.h"

#include <vector>

/// Sorts the first `count` tuples in rising order of value. Equal values are ordered too, by all else that a tuple holds
/// (the negative zero before the other, then the target's code, then the weight): weights with fractions are summed in this
/// order, and their sums must depend neither on the order of the records nor on the sort.
void SortTuples(std::vector<BINSortTuple>& tuples, unsigned int count);
void SortTuples(std::vector<BINValueTuple>& tuples, unsigned int count);

#endif
