#include "binning/celltable.h"

#include "binning/entropy.h"
#include "platform/arithmetic.h"

#include <algorithm>
#include <iterator>

namespace
{

/// Adds the cells of one row to those of another.
void AddRow(std::vector<double>& table, std::size_t numCells, std::size_t fromRow, std::size_t toRow)
{
    for (std::size_t cell = 0; cell < numCells; ++cell)
    {
        table[toRow * numCells + cell] += table[fromRow * numCells + cell];
    }
}

CountVector RowOf(const std::vector<double>& table, std::size_t numCells, std::size_t row)
{
    const auto first = table.begin() + static_cast<std::ptrdiff_t>(row * numCells);
    return CountVector(first, first + static_cast<std::ptrdiff_t>(numCells));
}

CountVector Sum(const CountVector& left, const CountVector& right)
{
    CountVector sum(left);
    for (std::size_t i = 0; i < sum.size(); ++i) sum[i] += right[i];
    return sum;
}

/// Decides which bins are joined and gives the left one of each two, in ascending order.
std::vector<std::size_t> FindMerges(double threshold, std::size_t numCells, const std::vector<double>& cells,
                                    std::size_t numCutPoints)
{
    std::vector<std::size_t> merges;
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
        merges.push_back(entropyRight < entropyLeft ? bin : bin - 1);
    }
    return merges;
}

} // namespace

std::vector<double> FillCells(const std::vector<double>& values, const std::vector<double>& table,
                              std::size_t numCategories, bool rightBorderClosed, const std::set<double>& cutPoints)
{
    std::vector<double> cells((cutPoints.size() + 1) * (numCategories + 1), 0.0);
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
        fillBin(std::min(values.size(), end + (rightBorderClosed ? 1 : 0)));
    }
    fillBin(values.size());
    return cells;
}

void MergeSmallBins(double threshold, std::size_t numCategories, std::vector<double>& cells,
                    std::set<double>& cutPoints)
{
    const std::size_t numCells = numCategories + 1;
    std::size_t numMerged = 0;
    for (const std::size_t merge : FindMerges(threshold, numCells, cells, cutPoints.size()))
    {
        // Each earlier merge has removed a row above this one.
        const std::size_t bin = merge - numMerged;
        AddRow(cells, numCells, bin + 1, bin);
        const auto gone = cells.begin() + static_cast<std::ptrdiff_t>((bin + 1) * numCells);
        cells.erase(gone, gone + static_cast<std::ptrdiff_t>(numCells));
        cutPoints.erase(std::next(cutPoints.begin(), static_cast<std::ptrdiff_t>(bin)));
        ++numMerged;
    }
}

double ComputeModelEntropy(const std::vector<double>& cells, std::size_t numCategories, double totalWeight)
{
    const std::size_t numCells = numCategories + 1;
    double sum = 0.0;
    for (std::size_t bin = 0; bin < cells.size() / numCells; ++bin)
    {
        const CountVector counts = RowOf(cells, numCells, bin);
        sum += Entropy(counts) * counts[0];
    }
    return sum / totalWeight;
}
