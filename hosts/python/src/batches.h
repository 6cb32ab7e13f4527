#ifndef MCBINNING_BATCHES_H
#define MCBINNING_BATCHES_H

#include "hosts/python/src/arrowabi.h"

#include <cstdint>

/// The batches of a table, one behind the other. Works with and without the GIL.
class Batches
{
public:
    virtual ~Batches() = default;

    virtual const ArrowSchema& GetSchema() const = 0;

    /// The next batch, valid until the next call, or null at the end. `row` is the number of rows before it.
    /// \throw StreamFault, or nanobind's python_error where the data come from Python code that raised something.
    virtual const ArrowArray* Next(std::int64_t row) = 0;
};

#endif
