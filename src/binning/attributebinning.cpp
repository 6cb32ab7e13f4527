// From the sorted tuples of one pair to its bins: rows, tally, split, cell table, merge of small bins, model entropy.

#include "binning/binalgorithm.h"
#include "binning/entropy.h"
#include "platform/arithmetic.h"

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
    std::vector<double> borders;
    for (unsigned int i = 0; i < fRecordCount; ++i)
    {
        const double value = (*tuples)[i].fValue;
        if (borders.empty() || value != borders.back())
            borders.push_back(value);
    }
    // The value at the open end of all rows is no inner border: nothing lies beyond it.
    if (fRightBorderClosed)
        borders.pop_back();
    else
        borders.erase(borders.begin());
    return BinRows(borders, cutPoints, cells, modelEntropy);
}

MCStatus BINAlgorithm::BinAttributePreBinned(const std::vector<BINSortTuple>* tuples, std::vector<double>& cuts,
                                             std::set<double>& cutPoints, std::vector<double>& cells,
                                             double& modelEntropy)
{
    if (fRightBorderClosed && !cuts.empty() && cuts.back() == (*tuples)[fRecordCount - 1].fValue)
        cuts.pop_back();
    else if (!fRightBorderClosed && !cuts.empty() && cuts.front() == tuples->front().fValue)
        cuts.erase(cuts.begin());
    return BinRows(cuts, cutPoints, cells, modelEntropy);
}

/// Both ways go on here, with the inner borders of the rows, which are turned into the row values on the way.
MCStatus BINAlgorithm::BinRows(std::vector<double>& borders, std::set<double>& cutPoints, std::vector<double>& cells,
                               double& modelEntropy)
{
    borders.push_back(kExtreme);
    borders.insert(borders.begin(), -kExtreme);
    std::vector<double> table;
    MCStatus status = fAttributeReader->TallyBins(&borders, fRightBorderClosed, table);
    if (!status.IsOK())
        return status;
    if (fRightBorderClosed)
        borders.erase(borders.begin());
    else
        borders.pop_back();

    const int numRows = static_cast<int>(table.size() / NumCategories());
    status = FindCutPoints(&borders, &table, 0, numRows - 1, cutPoints);
    if (cutPoints.empty())
        status = MakeWarning(MCBinning::BINStatusNoCutPoints);
    if (status.IsError())
        return status;
    FillCells(borders, table, cutPoints, cells);
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
    const std::size_t numCells = numCategories + 1;
    cells.assign((cutPoints.size() + 1) * numCells, 0.0);
    std::size_t row = 0;
    auto cut = cutPoints.begin();
    for (std::size_t bin = 0; bin <= cutPoints.size(); ++bin)
    {
        // Every cut point is the value of a row, and that row is the first of the next bin, or the last of this one.
        std::size_t end = values.size();
        if (cut != cutPoints.end())
        {
            end = row;
            while (end < values.size() && values[end] != *cut) ++end;
            if (fRightBorderClosed && end < values.size())
                ++end;
            ++cut;
        }
        double* const cell = cells.data() + bin * numCells;
        for (std::size_t category = 0; category < numCategories; ++category)
        {
            for (std::size_t i = row; i < end; ++i) cell[category + 1] += table[i * numCategories + category];
            cell[0] += cell[category + 1];
        }
        row = end;
    }
}

/// Decides on the merges, all of them on the table as it is: no decision changes the judgement of another bin. Only inner
/// bins are judged, and each against the smaller of its neighbours. A small bin joins the side that leaves the lower entropy.
std::vector<BINBinMerge> BINAlgorithm::FindSmallBins(const std::vector<double>& cells, std::size_t numCutPoints) const
{
    const std::size_t numCells = NumCategories() + 1;
    const double threshold = fSettings.GetSmallBinDetectionThreshold();
    std::vector<BINBinMerge> merges;
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
        merges.push_back(entropyRight < entropyLeft ? BINBinMerge{index, 'R'} : BINBinMerge{index - 1, 'L'});
    }
    return merges;
}

void BINAlgorithm::MergeSmallBins(std::vector<double>& cells, std::set<double>& cutPoints) const
{
    const std::size_t numCells = NumCategories() + 1;
    int numMerged = 0;
    for (const BINBinMerge& merge : FindSmallBins(cells, cutPoints.size()))
    {
        // Merges come in the order of the bins, and each one before this has taken a row away in front of it.
        const auto bin = static_cast<std::size_t>(merge.fBinIndex - numMerged);
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
