#ifndef MCBIN_CUTPOINTS_H
#define MCBIN_CUTPOINTS_H

#include "bins/bins.h"

class Progress;
class TableReader;
struct EvaluateOptions;

/// Bins without weight between the cut points that a user has given. Reads the table once, for the categories of the
/// target.
/// \throw Failure if a cut point is no number, they do not rise, or a column is absent or can't be used.
Bins MakeBinsOfCutPoints(TableReader& table, const EvaluateOptions& options, Progress& progress);

#endif
