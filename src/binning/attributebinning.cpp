// From the sorted tuples of one pair to its bins: rows, tally, split, cell table, merge of small bins, model entropy.

#include "binning/binalgorithm.h"
#include "binning/celltable.h"
#include "binning/entropysplit.h"
#include "data/tally.h"
#include "platform/arithmetic.h"

#include <limits>

using MCBinning::MCStatus;

namespace
{

/// The outer borders of the rows.
constexpr double kExtreme = std::numeric_limits<double>::max();

} // namespace

MCStatus BINAlgorithm::BinAttributeDirect(const std::vector<BINSortTuple>* tuples, std::set<double>& cutPoints,
                                          std::vector<double>& cells, double& modelEntropy)
{
    std::vector<double> values;
    std::vector<double> table;
    TallyDistinct(*tuples, fRecordCount, fAttributeReader->GetNumDistinct(), fNumTargetCategories, values, table);
    // The value at the open end of all rows is no border: the outer ones are, and they have to take it in.
    const bool isTooLarge = fRightBorderClosed ? values.back() > kExtreme : values.back() >= kExtreme;
    if (isTooLarge)
        return MakeWarning(MCBinning::BINStatusBadBinTable);
    if (fRightBorderClosed)
        values.back() = kExtreme;
    else
        values.front() = -kExtreme;
    return BinRows(values, table, cutPoints, cells, modelEntropy);
}

MCStatus BINAlgorithm::BinAttributePreBinned(const std::vector<BINSortTuple>* tuples, std::vector<double>& cuts,
                                             std::set<double>& cutPoints, std::vector<double>& cells,
                                             double& modelEntropy)
{
    if (fRightBorderClosed && !cuts.empty() && cuts.back() == (*tuples)[fRecordCount - 1].fValue)
        cuts.pop_back();
    else if (!fRightBorderClosed && !cuts.empty() && cuts.front() == tuples->front().fValue)
        cuts.erase(cuts.begin());
    cuts.push_back(kExtreme);
    cuts.insert(cuts.begin(), -kExtreme);
    std::vector<double> table;
    const MCStatus status = fAttributeReader->TallyBins(&cuts, fRightBorderClosed, table);
    if (!status.IsOK())
        return status;
    if (fRightBorderClosed)
        cuts.erase(cuts.begin());
    else
        cuts.pop_back();
    return BinRows(cuts, table, cutPoints, cells, modelEntropy);
}

/// Both kinds of rows end here: splits the value table and makes the bins.
MCStatus BINAlgorithm::BinRows(const std::vector<double>& values, const std::vector<double>& table,
                               std::set<double>& cutPoints, std::vector<double>& cells, double& modelEntropy)
{
    const int numRows = static_cast<int>(table.size() / NumCategories());
    MCStatus status = FindCutPoints(&values, &table, 0, numRows - 1, cutPoints);
    if (cutPoints.empty())
        status = MakeWarning(MCBinning::BINStatusNoCutPoints);
    if (status.IsError())
        return status;
    cells = FillCells(values, table, NumCategories(), fRightBorderClosed, cutPoints);
    const double threshold = fSettings.GetSmallBinDetectionThreshold();
    if (threshold > 0.0)
        MergeSmallBins(threshold, NumCategories(), cells, cutPoints);
    // The total is the reader's, summed in the order of the records.
    modelEntropy = ComputeModelEntropy(cells, NumCategories(), fAttributeReader->GetTotalWeight());
    return status;
}

MCStatus BINAlgorithm::FindCutPoints(const std::vector<double>* values, const std::vector<double>* table, int first,
                                     int last, std::set<double>& cutPoints) const
{
    if (values == nullptr || table == nullptr)
        return MakeError(MCBinning::BINStatusBadBinTable);
    return ::FindCutPoints(*values, *table, NumCategories(), fRightBorderClosed, first, last, cutPoints);
}
