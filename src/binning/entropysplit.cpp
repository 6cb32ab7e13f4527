// Recursive entropy minimisation under the minimum description length criterion, after
//   U. M. Fayyad and K. B. Irani, Multi-interval discretization of continuous-valued attributes for classification
//   learning, IJCAI 1993.
//
// Our decisions: N is the weight of a range and need not be whole. A category present on both sides of a cut counts twice in
// the Delta term. The rows tried are both rows around each pair of neighbours that is not pure in one and the same category.
// A cut point is the border of a row, no midpoint. Of equal candidates the lowest row stays.
//
// The order of the additions is part of the result. Logarithms of 0 and of negative numbers, and 0 / 0, are relied on: a NaN
// compares false, so it never becomes better than what is there, and never passes the test.

#include "binning/binalgorithm.h"
#include "platform/arithmetic.h"

#include <algorithm>
#include <cmath>
#include <stack>
#include <utility>

using MCBinning::MCStatus;

namespace
{

double Log2(double x)
{
    static const double kLn2 = std::log(2.0);
    return std::log(x) / kLn2;
}

/// A residual left by a subtraction counts as present: there is no tolerance.
int CountPresent(const std::vector<double>& counts)
{
    return static_cast<int>(
        std::count_if(counts.begin() + 1, counts.end(), [](double weight) { return weight != 0.0; }));
}

/// Adds the rows `first` to `last` to one side, category by category.
void AddRows(const std::vector<double>& table, int first, int last, std::vector<double>& side)
{
    const std::size_t numCategories = side.size() - 1;
    for (std::size_t category = 0; category < numCategories; ++category)
    {
        double& sum = side[category + 1];
        for (int row = first; row <= last; ++row)
            sum += table[static_cast<std::size_t>(row) * numCategories + category];
        side[0] += sum;
    }
}

/// Moves the rows `first` to `last` from the right side to the left.
void MoveRows(const std::vector<double>& table, int first, int last, std::vector<double>& left,
              std::vector<double>& right)
{
    const std::size_t numCategories = left.size() - 1;
    for (std::size_t category = 0; category < numCategories; ++category)
    {
        for (int row = first; row <= last; ++row)
        {
            const double weight = table[static_cast<std::size_t>(row) * numCategories + category];
            left[0] += weight;
            left[category + 1] += weight;
            right[0] -= weight;
            right[category + 1] -= weight;
        }
    }
}

/// Sums the one side and gets the other as what it leaves of the totals.
void SumAndSubtract(const std::vector<double>& table, int first, int last, const std::vector<double>& totals,
                    std::vector<double>& summed, std::vector<double>& rest)
{
    std::fill(summed.begin(), summed.end(), 0.0);
    AddRows(table, first, last, summed);
    std::transform(totals.begin(), totals.end(), summed.begin(), rest.begin(), std::minus<>());
}

} // namespace

/// Entropy in bits: the sum of -p log2 p over the categories present.
double BINAlgorithm::Entropy(const CountVector& counts)
{
    if (counts[0] == 0.0)
        return 0.0;
    double entropy = 0.0;
    for (std::size_t category = 1; category < counts.size(); ++category)
    {
        const double share = counts[category] / counts[0];
        const double p = share == 0.0 ? 1.0 : share; // an absent category adds nothing
        entropy = -(Log2(p) * p) + entropy;
    }
    return entropy;
}

/// The entropies of the two sides, each with the share of its weight.
double BINAlgorithm::PartitionEntropy(const CountVector& left, const CountVector& right)
{
    return (Entropy(left) * left[0] + Entropy(right) * right[0]) / (left[0] + right[0]);
}

/// Delta = log2(3^k - 2) - (k E(S) - kL E(L) - kR E(R)) with k = kL + kR, where kL and kR are the numbers of categories
/// present in the sides L and R, and `entropy` is that of the whole range, E(S).
double BINAlgorithm::MDLDelta(const CountVector& left, const CountVector& right, double entropy)
{
    const int numLeft = CountPresent(left);
    const int numRight = CountPresent(right);
    const int numBoth = numLeft + numRight;
    const double saved = numBoth * entropy - Entropy(left) * numLeft - Entropy(right) * numRight;
    return Log2(std::pow(3.0, numBoth) - 2.0) - saved;
}

MCStatus BINAlgorithm::FindCutPoints(const std::vector<double>* values, const std::vector<double>* table, int first,
                                     int last, std::set<double>& cutPoints) const
{
    if (values == nullptr || table == nullptr || values->size() != table->size() / NumCategories())
        return MakeError(MCBinning::BINStatusBadBinTable);

    CountVector left(NumCategories() + 1);
    CountVector right(NumCategories() + 1);
    std::stack<std::pair<int, int>> ranges;
    ranges.emplace(first, last);
    while (!ranges.empty())
    {
        const auto [rangeFirst, rangeLast] = ranges.top();
        ranges.pop();
        if (rangeLast <= rangeFirst)
            continue;
        const int cut = FindAcceptedCut(*table, rangeFirst, rangeLast, left, right);
        if (cut == kNoRow)
            continue;
        cutPoints.insert((*values)[static_cast<std::size_t>(cut)]);
        ranges.emplace(LastLeftRow(cut) + 1, rangeLast);
        ranges.emplace(rangeFirst, LastLeftRow(cut)); // all of the left part comes before the right one
    }
    return MCStatus();
}

/// The best cut of a range if its gain of information pays for its description: if it is above (log2(N - 1) + Delta) / N.
/// Else kNoRow.
int BINAlgorithm::FindAcceptedCut(const std::vector<double>& table, int first, int last, CountVector& left,
                                  CountVector& right) const
{
    std::fill(left.begin(), left.end(), 0.0);
    std::fill(right.begin(), right.end(), 0.0);
    AddRows(table, first, last, right);
    const double entropy = Entropy(right);
    const double weight = right[0];

    const int cut = FindBestCut(table, first, last, left, right);
    // A cut with all rows on one side would bring the same range back for ever. It gains nothing, but where the weight is
    // below 2 even that can be above the threshold.
    if (cut == kNoRow || LastLeftRow(cut) < first || LastLeftRow(cut) == last)
        return kNoRow;
    const double gain = entropy - PartitionEntropy(left, right);
    const double threshold = Log2(weight - 1.0) / weight + MDLDelta(left, right, entropy) / weight;
    return threshold < gain ? cut : kNoRow;
}

/// The candidate with the lowest partition entropy, or kNoRow if all rows are pure in one category. `left` arrives all zero
/// and `right` with the totals of the range; they leave with the two sides of the row.
int BINAlgorithm::FindBestCut(const std::vector<double>& table, int first, int last, CountVector& left,
                              CountVector& right) const
{
    const CountVector totals = right;
    int best = kNoRow;
    double bestEntropy = 0.0;
    int nextRow = first;
    for (int row = first; row <= last; ++row)
    {
        const bool isCandidate =
            (row < last && !IsSamePurePair(table, row)) || (row > first && !IsSamePurePair(table, row - 1));
        if (!isCandidate)
            continue;
        // Both count vectors run forward with the candidate, so each row is moved once: linear in rows, not quadratic.
        MoveRows(table, nextRow, LastLeftRow(row), left, right);
        nextRow = LastLeftRow(row) + 1;
        const double entropy = PartitionEntropy(left, right);
        // Strictly greater: of equal candidates the lowest row stays, and a NaN never replaces a best.
        if (best == kNoRow || bestEntropy > entropy)
        {
            best = row;
            bestEntropy = entropy;
        }
    }
    if (best == kNoRow)
        return kNoRow;

    // The scan has left the best row behind, with the roundings of all subtractions: the shorter side is summed afresh.
    const int lastLeft = LastLeftRow(best);
    if ((static_cast<double>(first) + last) * 0.5 >= best)
        SumAndSubtract(table, first, lastLeft, totals, left, right);
    else
        SumAndSubtract(table, lastLeft + 1, last, totals, right, left);
    return best;
}

/// Whether the row and the next one hold weight in one column only, the same for both.
bool BINAlgorithm::IsSamePurePair(const std::vector<double>& table, int row) const
{
    const double* upper = table.data() + static_cast<std::size_t>(row) * NumCategories();
    const double* lower = upper + NumCategories();
    int numCommon = 0;
    for (std::size_t category = 0; category < NumCategories(); ++category)
    {
        const bool isInUpper = upper[category] != 0.0;
        if (isInUpper != (lower[category] != 0.0))
            return false;
        numCommon += isInUpper ? 1 : 0;
    }
    return numCommon == 1;
}

/// The last row on the left of a cut at `row`: with the right border closed the row's own border is the cut, and the row
/// lies on the left.
int BINAlgorithm::LastLeftRow(int row) const
{
    return fRightBorderClosed ? row : row - 1;
}
