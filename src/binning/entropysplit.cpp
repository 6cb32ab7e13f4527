// Recursive entropy minimisation under the minimum description length criterion, after U. M. Fayyad and K. B. Irani,
// Multi-interval discretization of continuous-valued attributes for classification learning, IJCAI 1993.
//
// Our decisions are these. N is the weight of a range and need not be whole. A category present on both sides of a cut
// counts twice in the Delta term. The rows tried are both rows around each pair of neighbours that is not pure in one
// and the same category. A cut point is the border of a row, no midpoint. Of equal candidates the lowest row stays.
//
// The order of the additions is part of the result. Logarithms of 0 and of negative numbers, and 0 / 0, are relied on:
// a NaN compares false, so it never becomes better than what is there, and never passes the test.

#include "binning/entropysplit.h"

#include "base/makestatus.h"
#include "binning/cutscan.h"
#include "platform/arithmetic.h"

#include <algorithm>
#include <stack>
#include <utility>

using MCBinning::MCStatus;

namespace
{

/// The best cut of a range if its gain of information pays for its description: if it is above (log2(N - 1) + Delta) /
/// N. Else kNoRow. The two sides are working memory.
int FindAcceptedCut(CutScan& scan, int first, int last, CountVector& left, CountVector& right)
{
    std::fill(left.begin(), left.end(), 0.0);
    scan.SumRows(first, last, right);
    const double entropy = Entropy(right);
    const double weight = right[0];

    int cut = scan.FindBestCut(first, last, left, right);
    // A cut with all rows on one side gains nothing and is never taken: it would bring the same range back for ever.
    // Where the weight is below 2 no gain can be above the threshold, and then a cut that is only as good may pass.
    if (cut != CutScan::kNoRow && !scan.IsInnerCut(cut, first, last) && weight < 2.0)
    {
        std::fill(left.begin(), left.end(), 0.0);
        scan.SumRows(first, last, right);
        cut = scan.FindBestInnerCut(first, last, left, right);
    }
    if (cut == CutScan::kNoRow || !scan.IsInnerCut(cut, first, last))
        return CutScan::kNoRow;
    const double gain = entropy - PartitionEntropy(left, right);
    const double threshold = Log2(weight - 1.0) / weight + MDLDelta(left, right, entropy) / weight;
    return threshold < gain ? cut : CutScan::kNoRow;
}

} // namespace

MCStatus FindCutPoints(const std::vector<double>& values, const std::vector<double>& table, std::size_t numCategories,
                       bool rightBorderClosed, int first, int last, std::set<double>& cutPoints)
{
    if (values.size() != table.size() / numCategories)
        return MakeError(MCBinning::BINStatusBadBinTable);

    CutScan scan(table, numCategories, rightBorderClosed);
    CountVector left(numCategories + 1);
    CountVector right(numCategories + 1);
    std::stack<std::pair<int, int>> ranges;
    ranges.emplace(first, last);
    while (!ranges.empty())
    {
        const auto [rangeFirst, rangeLast] = ranges.top();
        ranges.pop();
        if (rangeLast <= rangeFirst)
            continue;
        const int cut = FindAcceptedCut(scan, rangeFirst, rangeLast, left, right);
        if (cut == CutScan::kNoRow)
            continue;
        cutPoints.insert(values[static_cast<std::size_t>(cut)]);
        ranges.emplace(scan.LastLeftRow(cut) + 1, rangeLast);
        ranges.emplace(rangeFirst, scan.LastLeftRow(cut)); // all of the left part comes before the right one
    }
    return MCStatus();
}
