#ifndef MCOBNQRT_BENCH_BAREPIPELINE_H
#define MCOBNQRT_BENCH_BAREPIPELINE_H

#include "bench/workloads.h"

#include <string>

/// The least that a run has to do, without any of the library's bookkeeping: spool the columns in blocks, read them
/// back in blocks for each attribute, sort the tuples with the library's own sort, ties in any order, and walk over
/// them once. With a target that is an entropy scan that works out every logarithm, without one it is a sum of the
/// weights.
///
/// The files are made in `directory` and stay there. \return a number that depends on all of it. \throw
/// std::runtime_error if a file can't be written or read.
double RunBare(const Workload& workload, const std::string& directory);

#endif
