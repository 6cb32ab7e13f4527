#include "data/tuplesort.h"

#include <algorithm>
#include <cmath>
#include <tuple>

namespace
{

/// What decides between two tuples of equal value.
std::tuple<bool, std::uint8_t, double> TieKey(const BINSortTuple& tuple)
{
    return {!std::signbit(tuple.fValue), tuple.fTargetCode, tuple.fWeight};
}

std::tuple<bool, double> TieKey(const BINValueTuple& tuple)
{
    return {!std::signbit(tuple.fValue), tuple.fWeight};
}

template<class Tuple>
void SortCompletely(std::vector<Tuple>& tuples, unsigned int count)
{
    std::sort(tuples.begin(), tuples.begin() + count,
              [](const Tuple& left, const Tuple& right)
              { return left.fValue != right.fValue ? left < right : TieKey(left) < TieKey(right); });
}

} // namespace

void SortTuples(std::vector<BINSortTuple>& tuples, unsigned int count)
{
    SortCompletely(tuples, count);
}

void SortTuples(std::vector<BINValueTuple>& tuples, unsigned int count)
{
    SortCompletely(tuples, count);
}
