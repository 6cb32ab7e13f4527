#ifndef MCOBNQRT_GROWTH_H
#define MCOBNQRT_GROWTH_H

#include <vector>

/// Makes room for one more element, so that the push_back that follows can't fail. An operation that changes several
/// members makes all of them ready first, and then either all change or none.
///
/// Grows by doubling: to reserve just one element each time would copy the vector at every addition.
template<class Element>
void ReserveOneMore(std::vector<Element>& elements)
{
    if (elements.size() == elements.capacity())
        elements.reserve(2 * elements.size() + 1);
}

#endif
