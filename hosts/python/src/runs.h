#ifndef MCBINNING_RUNS_H
#define MCBINNING_RUNS_H

#include "hosts/python/src/blocks.h"
#include "hosts/python/src/calls.h"
#include "hosts/python/src/variable.h"

#include <mcobnqrt/binattributeresults.h>
#include <mcobnqrt/binattributetargetresults.h>
#include <mcobnqrt/mcstatus.h>

#include <cstdint>
#include <string>
#include <vector>

/// What both kinds of run are told.
struct RunOptions
{
    int numBins = 0;
    int maxDistinct = 0; ///< 0 for no limit; of a supervised run
    double smallBinRatio = 0.0;
    bool isRightClosed = true;
    std::string tempDir; ///< empty for the system's
};

/// How a run ended, and what it found. The results of a cancelled one are not complete.
template<class Result>
struct Outcome
{
    MCBinning::MCStatus status;
    std::vector<Result> results;
    std::int64_t numRecords = 0; ///< that were read, whatever their weight
    std::string version;         ///< of the component, as the library tells it
};

/// Bins the pairs (attributes[i], targets[i]), which are indices of `variables`, as they are in `blocks`, and these are
/// LibraryBlocks. No variable is declared as the target of the others. Takes no GIL but for `progress` and `interrupts`. \param progress may be
/// None.
Outcome<BINAttributeTargetResults> RunSupervised(BlockSource& blocks, const std::vector<Variable>& variables,
                                                 const std::vector<int>& attributes, const std::vector<int>& targets,
                                                 const RunOptions& options, const nanobind::object& progress,
                                                 Interrupts& interrupts);

/// Bins the attributes, as above.
Outcome<BINAttributeResults> RunEqualFrequency(BlockSource& blocks, const std::vector<Variable>& variables,
                                               const std::vector<int>& attributes, const RunOptions& options,
                                               const nanobind::object& progress, Interrupts& interrupts);

#endif
