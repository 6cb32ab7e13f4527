#ifndef MCBINNING_ARRAYS_H
#define MCBINNING_ARRAYS_H

#include <nanobind/nanobind.h>
#include <nanobind/ndarray.h>

#include <cstddef>
#include <memory>
#include <utility>
#include <vector>

/// An array of the user's, of which the numbers are read where they lie.
using Array = nanobind::ndarray<nanobind::ro, nanobind::device::cpu, nanobind::ndim<1>>;
using Numbers = nanobind::ndarray<nanobind::numpy, double>;

/// A NumPy array of the numbers, which it owns: of rows of `numColumns`, or of one dimension with 0.
inline nanobind::object ToArray(std::vector<double> values, std::size_t numColumns = 0)
{
    auto owned = std::make_unique<std::vector<double>>(std::move(values));
    double* const data = owned->data();
    const std::size_t size = owned->size();
    const nanobind::capsule owner(owned.get(), [](void* p) noexcept { delete static_cast<std::vector<double>*>(p); });
    owned.release(); // the capsule's now
    return nanobind::cast(numColumns == 0 ? Numbers(data, {size}, owner)
                                          : Numbers(data, {size / numColumns, numColumns}, owner));
}

#endif
