#ifndef MCOBNQRT_GROWTH_H
#define MCOBNQRT_GROWTH_H

#include <algorithm>
#include <cstddef>
#include <vector>

/// Makes room for `count` more elements, so that adding them can't fail. An operation that changes several members
/// makes all of them ready first, and then either all change or none.
///
/// Grows by doubling at least: to reserve just what is needed would copy the vector at every addition.
template<class Element>
void ReserveMore(std::vector<Element>& elements, std::size_t count)
{
    const std::size_t needed = elements.size() + count;
    if (needed > elements.capacity())
        elements.reserve(std::max(needed, 2 * elements.capacity()));
}

template<class Element>
void ReserveOneMore(std::vector<Element>& elements)
{
    ReserveMore(elements, 1);
}

#endif
