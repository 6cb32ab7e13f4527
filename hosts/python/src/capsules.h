#ifndef MCBINNING_CAPSULES_H
#define MCBINNING_CAPSULES_H

#include "hosts/python/src/batches.h"

#include <nanobind/nanobind.h>

#include <memory>

/// The batches of the stream in a capsule named "arrow_array_stream", which is empty from now on. `explain` is None or a
/// Python function that makes a message for the user of the one with which the stream failed.
std::unique_ptr<Batches> OpenStream(nanobind::capsule stream, nanobind::object explain);

/// The batches of a Python iterator, each with the method __arrow_c_array__; `schema` is a capsule named
/// "arrow_schema". What the iterator raises passes through unchanged, which it doesn't through a stream.
std::unique_ptr<Batches> OpenIterator(nanobind::capsule schema, nanobind::object iterator);

#endif
