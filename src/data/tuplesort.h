#ifndef MCOBNQRT_TUPLESORT_H
#define MCOBNQRT_TUPLESORT_H

#include "data/binsorttuple.h"
#include "data/binvaluetuple.h"

#include <vector>

/// What becomes of tuples of equal value. Sums over them must depend neither on the order of the records nor on the
/// sort.
enum class TieOrder
{
    kAny,     ///< for weights whose sums are exact, so that no order makes a difference
    kComplete ///< by all else that a tuple holds: the target's code, then the weight
};

/// Sorts the first `count` tuples in rising order of value; the negative zero comes before the other.
void SortTuples(std::vector<BINSortTuple>& tuples, unsigned int count, TieOrder ties);
void SortTuples(std::vector<BINValueTuple>& tuples, unsigned int count, TieOrder ties);

#endif
