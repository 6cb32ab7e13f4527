#ifndef MCOBNQRT_BINS_EVALUATION_H
#define MCOBNQRT_BINS_EVALUATION_H

#include "bins/bins.h"
#include "bins/bintally.h"
#include "bins/rows.h"

#include <cstddef>
#include <optional>
#include <string>
#include <vector>

/// Bins in two populations: that of which they were made, and one in which they were counted afterwards.
struct Evaluation
{
    Bins first;
    Bins second;                                 ///< its results are those of `first` that have bins
    std::vector<std::size_t> indices;            ///< by result of `second`: that of `first`
    std::vector<Strangers> strangers;            ///< by result of `second`
    std::vector<std::vector<ValueRange>> ranges; ///< by result of `second`, and by its bin
    double weightOfUnseenTargets = 0.0; ///< of records in `second` with a category of a target that is not known

    const AttributeBins& GetFirst(std::size_t index) const { return first.results[indices[index]]; }
    const AttributeBins& GetSecond(std::size_t index) const { return second.results[index]; }
};

/// An evaluation in which nothing has been counted yet.
Evaluation BeginEvaluation(Bins first);

/// Adds the results of an evaluation of the same bins in the same population.
void AddResults(Evaluation& whole, const Evaluation& part);

/// A row of a table of both populations.
struct EvaluationRow
{
    BinRow first;
    BinRow second;
    /// Its part of the population stability index (a - b) ln(a / b), where a and b are the shares in the second and the
    /// first population; of the total the sum. A bin that is empty in one of them has the smoothing added to both of its
    /// weights there and here; without smoothing the index is infinite then. Nothing where a population has no weight.
    std::optional<double> stability;
};

/// The bins, the missing, the records of unseen categories, the latter two if they have weight in a population, and the
/// total.
std::vector<EvaluationRow> MakeRows(const Evaluation& evaluation, std::size_t index);

/// The population stability index; nothing where a population has no weight.
std::optional<double> ComputeStability(const Evaluation& evaluation, std::size_t index);

/// The index from which a population counts as drifting, and as shifted.
inline constexpr double kDrifting = 0.1;
inline constexpr double kShifted = 0.25;

/// What should be looked at, in words: a population that has drifted, and unseen categories. Empty if all is well.
std::vector<std::string> FindFlags(const Evaluation& evaluation, std::size_t index);

/// Whether there is any flag, or records were left out for a category of a target that is not known.
bool IsFlagged(const Evaluation& evaluation);

/// The evaluation as JSON, in the form that docs/json.md describes.
std::string ToJson(const Evaluation& evaluation);

/// A head, and a row for each row of each result.
std::string ToCsv(const Evaluation& evaluation);

#endif
