// From the sorted tuples of one pair to its bins: rows, tally, split, cell table, merge of small bins, model entropy.

#include "binning/binalgorithm.h"
#include "binning/entropy.h"
#include "platform/arithmetic.h"

#include <algorithm>
#include <iterator>
#include <limits>

using MCBinning::MCStatus;

namespace
{

/// The outer borders of the rows.
constexpr double kExtreme = std::numeric_limits<double>::max();

/// Adds the cells [row * numCells, (row + 1) * numCells) of the table to those of another row.
void AddRow(std::vector<double>& table, std::size_t numCells, std::size_t fromRow, std::size_t toRow)
{
    for (std::size_t cell = 0; cell < numCells; ++cell)
        table[toRow * numCells + cell] += table[fromRow * numCells + cell];
}

std::vector<double> RowOf(const std::vector<double>& table, std::size_t numCells, std::size_t row)
{
    const auto first = table.begin() + static_cast<std::ptrdiff_t>(row * numCells);
    return std::vector<double>(first, first + static_cast<std::ptrdiff_t>(numCells));
}

std::vector<double> Sum(const std::vector<double>& left, const std::vector<double>& right)
{
    std::vector<double> sum(left);
    for (std::size_t i = 0; i < sum.size(); ++i) sum[i] += right[i];
    return sum;
}

} // namespace

MCStatus BINAlgorithm::BinAttributeDirect(const std::vector<BINSortTuple>* tuples, std::set<double>& cutPoints,
                                          std::vector<double>& cells, double& modelEntropy)
{
    std::vector<double> values;
    std::vector<double> table;
    TallyDistinct(*tuples, values, table);
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

/// Makes a row of each distinct value, in one walk.
void BINAlgorithm::TallyDistinct(const std::vector<BINSortTuple>& tuples, std::vector<double>& values,
                                 std::vector<double>& table) const
{
    const std::size_t numDistinct = fAttributeReader->GetNumDistinct();
    table.assign(numDistinct * NumCategories(), 0.0);
    values.reserve(numDistinct);
    double* row = table.data();
    for (unsigned int i = 0; i < fRecordCount; ++i)
    {
        const BINSortTuple& tuple = tuples[i];
        if (values.empty() || tuple.fValue != values.back())
        {
            row = table.data() + values.size() * NumCategories();
            values.push_back(tuple.fValue);
        }
        row[tuple.fTargetCode] += tuple.fWeight;
    }
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

/// Both ways go on here, with a value table and its row values.
MCStatus BINAlgorithm::BinRows(const std::vector<double>& values, const std::vector<double>& table,
                               std::set<double>& cutPoints, std::vector<double>& cells, double& modelEntropy)
{
    const int numRows = static_cast<int>(table.size() / NumCategories());
    MCStatus status = FindCutPoints(&values, &table, 0, numRows - 1, cutPoints);
    if (cutPoints.empty())
        status = MakeWarning(MCBinning::BINStatusNoCutPoints);
    if (status.IsError())
        return status;
    FillCells(values, table, cutPoints, cells);
    if (fSettings.GetSmallBinDetectionThreshold() > 0.0 && cutPoints.size() > 1)
        MergeSmallBins(cells, cutPoints);
    ComputeModelEntropy(cells, modelEntropy);
    return status;
}

/// Adds up the rows of the value table between the cut points.
void BINAlgorithm::FillCells(const std::vector<double>& values, const std::vector<double>& table,
                             const std::set<double>& cutPoints, std::vector<double>& cells) const
{
    const std::size_t numCategories = NumCategories();
    cells.assign((cutPoints.size() + 1) * (numCategories + 1), 0.0);
    double* cell = cells.data();
    std::size_t row = 0;
    const auto fillBin = [&](std::size_t end)
    {
        for (; row < end; ++row)
        {
            for (std::size_t c = 0; c < numCategories; ++c) cell[c + 1] += table[row * numCategories + c];
        }
        for (std::size_t c = 0; c < numCategories; ++c) cell[0] += cell[c + 1];
        cell += numCategories + 1;
    };
    for (const double cutPoint : cutPoints)
    {
        // Every cut point is the value of a row, which is the last of this bin or the first of the next.
        std::size_t end = row;
        while (end < values.size() && values[end] != cutPoint) ++end;
        fillBin(std::min(values.size(), end + (fRightBorderClosed ? 1 : 0)));
    }
    fillBin(values.size());
}

/// Decides on the merges, all of them on the table as it is: no decision changes the judgement of another bin. Only
/// inner bins are judged, and each against the smaller of its neighbours. A small bin joins the side that leaves the
/// lower entropy. Gives the left one of each two bins to be joined.
std::vector<int> BINAlgorithm::FindSmallBins(const std::vector<double>& cells, std::size_t numCutPoints) const
{
    const std::size_t numCells = NumCategories() + 1;
    const double threshold = fSettings.GetSmallBinDetectionThreshold();
    std::vector<int> merges;
    for (std::size_t bin = 1; bin < numCutPoints; ++bin)
    {
        const CountVector previous = RowOf(cells, numCells, bin - 1);
        const CountVector own = RowOf(cells, numCells, bin);
        const CountVector next = RowOf(cells, numCells, bin + 1);
        const double smallerNeighbour = previous[0] > next[0] ? next[0] : previous[0];
        if (!(threshold * smallerNeighbour > own[0]))
            continue;
        const double entropyLeft = PartitionEntropy(Sum(own, previous), next);
        const double entropyRight = PartitionEntropy(Sum(own, next), previous);
        const int index = static_cast<int>(bin);
        merges.push_back(entropyRight < entropyLeft ? index : index - 1);
    }
    return merges;
}

void BINAlgorithm::MergeSmallBins(std::vector<double>& cells, std::set<double>& cutPoints) const
{
    const std::size_t numCells = NumCategories() + 1;
    int numMerged = 0;
    for (const int merge : FindSmallBins(cells, cutPoints.size()))
    {
        // Merges come in the order of the bins, and each one before this has taken a row away in front of it.
        const auto bin = static_cast<std::size_t>(merge - numMerged);
        AddRow(cells, numCells, bin + 1, bin);
        const auto gone = cells.begin() + static_cast<std::ptrdiff_t>((bin + 1) * numCells);
        cells.erase(gone, gone + static_cast<std::ptrdiff_t>(numCells));
        cutPoints.erase(std::next(cutPoints.begin(), static_cast<std::ptrdiff_t>(bin)));
        ++numMerged;
    }
}

/// The mean entropy of the bins, each with its weight. The total is the reader's, in the order of the records.
void BINAlgorithm::ComputeModelEntropy(const std::vector<double>& cells, double& modelEntropy) const
{
    const std::size_t numCells = NumCategories() + 1;
    double sum = 0.0;
    for (std::size_t bin = 0; bin < cells.size() / numCells; ++bin)
    {
        const CountVector counts = RowOf(cells, numCells, bin);
        sum += Entropy(counts) * counts[0];
    }
    modelEntropy = sum / fAttributeReader->GetTotalWeight();
}
