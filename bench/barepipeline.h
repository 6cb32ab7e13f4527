#ifndef MCOBNQRT_BENCH_BAREPIPELINE_H
#define MCOBNQRT_BENCH_BAREPIPELINE_H

#include "workloads.h"

#include <string>

/// The least that a run has to do, without any of the library's bookkeeping: spool the columns in blocks, read them back in
/// blocks for each attribute, sort the tuples with the library's own sort, and walk over them once: with a target an entropy
/// scan that works out every logarithm, without one a sum of the weights. \return a number that depends on all of it.
double RunBare(const Workload& workload, const std::string& directory);

#endif
