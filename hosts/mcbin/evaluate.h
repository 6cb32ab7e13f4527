#ifndef MCBIN_EVALUATE_H
#define MCBIN_EVALUATE_H

#include "bins/bins.h"
#include "bins/evaluation.h"

#include <string>
#include <vector>

class Progress;
class TableReader;
struct BinOptions;
struct EvaluateOptions;

/// What evaluate() has to tell.
struct Evaluated
{
    Evaluation evaluation;
    std::vector<std::string> notes; ///< for the user
};

/// Counts the rows of a table in bins that a file has, or that are made from cut points alone. What `first` is of such
/// bins has no weight.
/// \throw Failure if a file can't be read, a column is absent, or a field can't be used.
Evaluated EvaluateBins(const EvaluateOptions& options, Progress& progress);

/// Makes the cut points the shortest decimals between the values of the table that they part. The bins were made of the
/// table, which is read again for it.
Bins RoundCutPoints(TableReader& table, Bins bins, const BinOptions& options, Progress& progress);

#endif
