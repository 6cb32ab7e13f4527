#ifndef MCOBNQRT_BINS_RUN_H
#define MCOBNQRT_BINS_RUN_H

#include "bins/bins.h"
#include "bins/infinitevalues.h"

#include <optional>
#include <string>
#include <vector>

class BINVarList;
class IBINRecordSource;
class MCQueryCancel;
class ProgressListener;
class WeightGrid;

/// What a host brings to a run. All that is pointed to is the host's and outlives the run.
struct RunHost
{
    IBINRecordSource* records = nullptr;
    /// By variable index: the values that `records` has handed on; complete when the records are.
    const std::vector<InfiniteValues>* values = nullptr;
    const WeightGrid* weightGrid = nullptr; ///< that `records` has put the weights on
    MCQueryCancel* cancel = nullptr;        ///< null for none
    ProgressListener* listener = nullptr;   ///< null for none
    int numRecordsBetweenReports = 0;       ///< 0 for the library's default
    std::string tempDirectory;              ///< empty for the library's default
};

/// Runs the library as `bins.settings` say, and adds to `bins` what comes of it: the component's version, the status of
/// the run, the results, and the grid of the weights.
///
/// `variables` are those of `bins`, in their order. `attributes` and `targets` are lists of variable indices, or null,
/// as IBINAlgorithm::Run() takes them. With equal frequency `targets` is not looked at.
///
/// If the run fails there are no results but those that it had found before, and the status tells why. What the host's
/// objects throw comes through.
void RunBinning(Bins& bins, BINVarList& variables, const std::vector<int>* attributes, const std::vector<int>* targets,
                const RunHost& host);

/// Tells of what the weights were made multiples: of a weight among the variables, if there is one.
void SetWeightGrid(Bins& bins, std::optional<double> step);

#endif
