#ifndef MCBINNING_BATCHES_H
#define MCBINNING_BATCHES_H

#include "arrowabi.h"

#include <nanobind/nanobind.h>

#include <cstdint>
#include <memory>

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

/// The batches of the stream in a capsule named "arrow_array_stream", which is empty from now on. `explain` is None or a
/// Python function that makes a message for the user of the one with which the stream failed.
std::unique_ptr<Batches> OpenStream(nanobind::capsule stream, nanobind::object explain);

/// The batches of a Python iterator, each with the method __arrow_c_array__; `schema` is a capsule named
/// "arrow_schema". What the iterator raises passes through unchanged, which it doesn't through a stream.
std::unique_ptr<Batches> OpenIterator(nanobind::capsule schema, nanobind::object iterator);

#endif
