// To work out the partition entropy of a candidate takes 2 K logarithms, and few candidates can be the best. So a range is
// cut into segments, and a segment is left out when a bound for all its candidates is above the best one found.
//
// The bound. Let H(v) = v0 log2 v0 - sum over c of vc log2 vc be the entropy of a count vector times its weight. H is concave
// and of degree one, so it is superadditive, and at a boundary with the sides L and R, for any candidate between it and the
// next boundary, which moves m from R to L, 0 <= m <= M:
//
//     H(L + m) + H(R - m)  >=  H(L) + H(R) + sum over c of mc (log2(L'0 / L'c) - log2(R'0 / R'c))       (a)
//     H(L + m) + H(R - m)  >=  H(L) + H(R - M)                                                          (b)
//
// (a) is the tangent at the new sides L' = L + m and R' = R - m. With L'0 >= L0, L'c <= Lc + Mc, L'c <= L'0, R'0 <= R0 and
// R'c >= Rc - Mc the bracket is at least bc = max(0, log2(L0 / (Lc + Mc))) - log2(R0 / (Rc - Mc)), and mc bc at least
// Mc min(0, bc). All logarithms are those of the two boundaries. The larger of (a) and (b) is taken.
//
// The margin. What is compared with the bound is the partition entropy as it is worked out, times the weight N. With u = 2^-53,
// an entropy is off by at most (40 + 8 K) u, and the terms of the bound, each at most N log2 N <= 53 N, by 212 (K + 3) u N
// together: 1024 (K + 4) u N is enough for both. That is all where the cells are whole numbers with exact sums. Otherwise
// the sides are running sums of n rows, each off by up to e = 2 n K u N, a residual of a category that is used up among them.
// No partial sum is finer than the last bit of the smallest cell, so no logarithm is above g = log2(N / smallest cell) + 54 in
// size, and an error of e in each count of both sides moves their H by at most 2 K (3 g + 16) e.
//
// For a million rows of three categories this takes a scan from 60 ms to less than one with whole numbers, and to 5 with
// fractions, which have to be summed row by row.

#include "binning/cutscan.h"

#include "platform/arithmetic.h"

#include <algorithm>
#include <cmath>
#include <functional>
#include <limits>

namespace
{

constexpr int kBlockSize = 64; ///< rows of a segment

/// Ranges with fewer rows are walked over: the bounds cost as much as they save.
constexpr int kFewestBoundedRows = 4 * kBlockSize;

constexpr double kLargestWhole = 9007199254740992.0; ///< 2^53: a double holds all whole numbers up to it
constexpr double kLargestSpread = 4294967296.0;      ///< of weights with fractions; beyond it the margin says nothing

/// 0 log2 0 is 0 here, as in an entropy.
double Times(double count, double log2)
{
    return count == 0.0 ? 0.0 : count * log2;
}

} // namespace

void CutScan::Side::Set(const double* counts, std::size_t size)
{
    fCounts.assign(counts, counts + size);
    fLogs.resize(size);
    std::transform(counts, counts + size, fLogs.begin(), [](double count) { return std::log2(count); });
    fEntropy = Times(fCounts[0], fLogs[0]);
    for (std::size_t c = 1; c < size; ++c) fEntropy -= Times(fCounts[c], fLogs[c]);
}

CutScan::CutScan(const std::vector<double>& table, std::size_t numCategories, bool rightBorderClosed)
    : fTable(table), fNumCategories(numCategories), fRightBorderClosed(rightBorderClosed)
{
    if (fTable.size() >= static_cast<std::size_t>(kFewestBoundedRows) * fNumCategories)
        CountBlocks();
}

/// Adds up the table block by block, and finds out what its sums are like on the way.
void CutScan::CountBlocks()
{
    const int numRows = static_cast<int>(fTable.size() / fNumCategories);
    std::vector<double> counts(fNumCategories, 0.0);
    double total = 0.0;
    fIsExact = true;
    fSmallestCell = std::numeric_limits<double>::infinity();
    for (int row = 0; row < numRows; ++row)
    {
        if (row % kBlockSize == 0)
            fRowsBefore.insert(fRowsBefore.end(), counts.begin(), counts.end());
        const double* const cells = Row(row);
        for (std::size_t c = 0; c < fNumCategories; ++c)
        {
            const double cell = cells[c];
            if (cell == 0.0)
                continue;
            counts[c] += cell;
            total += cell;
            fIsExact = fIsExact && cell == std::floor(cell);
            fSmallestCell = std::min(fSmallestCell, cell);
        }
    }
    fIsExact = fIsExact && total <= kLargestWhole;
}

/// The counts of all rows before `row`, of an exact table.
void CutScan::CountRowsBefore(int row, double* categories) const
{
    const int block = std::min(row / kBlockSize, static_cast<int>(fRowsBefore.size() / fNumCategories) - 1);
    const auto before =
        fRowsBefore.begin() + static_cast<std::ptrdiff_t>(static_cast<std::size_t>(block) * fNumCategories);
    std::copy(before, before + static_cast<std::ptrdiff_t>(fNumCategories), categories);
    AddRows(block * kBlockSize, row - 1, categories);
}

void CutScan::AddRows(int first, int last, double* categories) const
{
    for (int row = first; row <= last; ++row)
    {
        const double* const cells = Row(row);
        for (std::size_t c = 0; c < fNumCategories; ++c) categories[c] += cells[c];
    }
}

void CutScan::SumRows(int first, int last, CountVector& counts) const
{
    std::fill(counts.begin(), counts.end(), 0.0);
    if (fIsExact)
    {
        CountVector before(fNumCategories);
        CountRowsBefore(first, before.data());
        CountRowsBefore(last + 1, counts.data() + 1);
        for (std::size_t c = 0; c < fNumCategories; ++c) counts[c + 1] -= before[c];
    }
    else
        AddRows(first, last, counts.data() + 1);
    for (std::size_t c = 0; c < fNumCategories; ++c) counts[0] += counts[c + 1];
}

int CutScan::FindBestCut(int first, int last, CountVector& left, CountVector& right)
{
    const Range range{first, last};
    const CountVector totals = right;
    Best best;
    if (CanBeBounded(range, totals[0]))
        best = FindBounded(range, totals);
    else
        TryRows(range, range, first, left, right, best);
    if (best.fRow == kNoRow)
        return kNoRow;

    // The sides are those of another row by now, with the roundings of all subtractions. The shorter one is summed afresh, the
    // other is what it leaves of the totals.
    const int lastLeft = LastLeftRow(best.fRow);
    const bool isLeftShorter = (static_cast<double>(first) + last) * 0.5 >= best.fRow;
    CountVector& summed = isLeftShorter ? left : right;
    CountVector& rest = isLeftShorter ? right : left;
    if (isLeftShorter)
        SumRows(first, lastLeft, summed);
    else
        SumRows(lastLeft + 1, last, summed);
    std::transform(totals.begin(), totals.end(), summed.begin(), rest.begin(), std::minus<>());
    return best.fRow;
}

/// Whether the row and the next one hold weight in one column only, the same for both.
bool CutScan::IsSamePurePair(int row) const
{
    const double* const upper = Row(row);
    const double* const lower = Row(row + 1);
    int numCommon = 0;
    for (std::size_t c = 0; c < fNumCategories; ++c)
    {
        const bool isInUpper = upper[c] != 0.0;
        if (isInUpper != (lower[c] != 0.0))
            return false;
        numCommon += isInUpper ? 1 : 0;
    }
    return numCommon == 1;
}

/// Both rows around each pair of neighbours that is not pure in one and the same category.
bool CutScan::IsCandidate(int row, Range range) const
{
    return (row < range.fLast && !IsSamePurePair(row)) || (row > range.fFirst && !IsSamePurePair(row - 1));
}

/// Moves rows from the right side to the left, row by row. That is the order of additions which counts: between two
/// candidates there is more than one row only where all of them are pure in one category.
void CutScan::MoveRows(int first, int last, CountVector& left, CountVector& right) const
{
    for (int row = first; row <= last; ++row)
    {
        const double* const cells = Row(row);
        for (std::size_t c = 0; c < fNumCategories; ++c)
        {
            left[0] += cells[c];
            left[c + 1] += cells[c];
            right[0] -= cells[c];
            right[c + 1] -= cells[c];
        }
    }
}

/// Works out every candidate among `rows`. The sides arrive with all rows of the range before `nextRow` on the left.
void CutScan::TryRows(Range rows, Range range, int nextRow, CountVector& left, CountVector& right, Best& best) const
{
    for (int row = rows.fFirst; row <= rows.fLast; ++row)
    {
        if (!IsCandidate(row, range))
            continue;
        // Both count vectors run forward with the candidate, so each row is moved once: linear in rows, not quadratic.
        MoveRows(nextRow, LastLeftRow(row), left, right);
        nextRow = LastLeftRow(row) + 1;
        const double entropy = PartitionEntropy(left, right);
        // A NaN never replaces a best, and a NaN that came first is never replaced.
        if (best.fRow == kNoRow || best.fEntropy > entropy || (best.fEntropy == entropy && row < best.fRow))
            best = {row, entropy};
    }
}

bool CutScan::CanBeBounded(Range range, double weight) const
{
    const bool isLongEnough = range.fLast - range.fFirst + 1 >= kFewestBoundedRows;
    return isLongEnough && (fIsExact || weight < kLargestSpread * fSmallestCell);
}

double CutScan::Margin(Range range, double weight) const
{
    constexpr double kUnit = std::numeric_limits<double>::epsilon() / 2;
    const auto numCategories = static_cast<double>(fNumCategories);
    const double ofEntropies = 1024.0 * (numCategories + 4.0) * kUnit * weight;
    if (fIsExact)
        return ofEntropies;
    const double numRows = static_cast<double>(range.fLast) - range.fFirst + 1.0;
    const double ofSums = 2.0 * numRows * numCategories * kUnit * weight;
    const double largestLog = std::log2(weight / fSmallestCell) + 54.0;
    return ofEntropies + 2.0 * numCategories * (3.0 * largestLog + 16.0) * ofSums;
}

CutScan::Best CutScan::FindBounded(Range range, const CountVector& totals)
{
    FindStates(range, totals);
    const std::size_t promising = FindBounds();
    Best best;
    // In order up to the first candidate: if that is a NaN, it stays.
    std::size_t segment = 0;
    for (; segment < NumSegments() && best.fRow == kNoRow; ++segment) TrySegment(segment, range, best);
    if (best.fRow == kNoRow || std::isnan(best.fEntropy))
        return best;

    TrySegment(promising, range, best);
    const double weight = totals[0];
    const double margin = Margin(range, weight);
    for (; segment < NumSegments(); ++segment)
    {
        // Asked this way round, so that a bound that is not a number leaves nothing out.
        if (!(fBounds[segment] > best.fEntropy * weight + margin))
            TrySegment(segment, range, best);
    }
    return best;
}

/// Sets the boundaries of a range, at whole blocks, and the sides at each of them.
void CutScan::FindStates(Range range, const CountVector& totals)
{
    fBoundaries.assign(1, range.fFirst);
    for (int row = (range.fFirst / kBlockSize + 1) * kBlockSize; row <= range.fLast; row += kBlockSize)
        fBoundaries.push_back(row);
    fBoundaries.push_back(range.fLast + 1);
    fStates.resize(fBoundaries.size() * StateSize());

    CountVector left(fNumCategories + 1, 0.0);
    CountVector right(totals);
    CountVector beforeRange(fNumCategories);
    if (fIsExact)
        CountRowsBefore(range.fFirst, beforeRange.data());
    for (std::size_t boundary = 0; boundary < fBoundaries.size(); ++boundary)
    {
        if (fIsExact)
        {
            CountRowsBefore(fBoundaries[boundary], left.data() + 1);
            left[0] = 0.0;
            for (std::size_t c = 0; c < fNumCategories; ++c) left[0] += left[c + 1] -= beforeRange[c];
            std::transform(totals.begin(), totals.end(), left.begin(), right.begin(), std::minus<>());
        }
        else if (boundary > 0)
            MoveRows(fBoundaries[boundary - 1], fBoundaries[boundary] - 1, left, right);
        const auto state = fStates.begin() + static_cast<std::ptrdiff_t>(boundary * StateSize());
        std::copy(right.begin(), right.end(), std::copy(left.begin(), left.end(), state));
    }
}

/// Sets the bound of each segment. \return the segment at whose begin the partition entropy is lowest.
std::size_t CutScan::FindBounds()
{
    const std::size_t size = fNumCategories + 1;
    Side left;
    Side right;
    Side nextLeft;
    Side nextRight;
    left.Set(fStates.data(), size);
    right.Set(fStates.data() + size, size);
    fBounds.resize(NumSegments());
    std::size_t promising = 0;
    double lowest = std::numeric_limits<double>::infinity();
    for (std::size_t segment = 0; segment < NumSegments(); ++segment)
    {
        const double* const nextState = fStates.data() + (segment + 1) * StateSize();
        nextLeft.Set(nextState, size);
        nextRight.Set(nextState + size, size);
        fBounds[segment] = BoundOf(left, right, nextLeft, nextRight);
        if (left.fEntropy + right.fEntropy < lowest)
        {
            promising = segment;
            lowest = left.fEntropy + right.fEntropy;
        }
        std::swap(left, nextLeft);
        std::swap(right, nextRight);
    }
    return promising;
}

double CutScan::BoundOf(const Side& left, const Side& right, const Side& nextLeft, const Side& nextRight) const
{
    double tangent = left.fEntropy + right.fEntropy;
    for (std::size_t c = 1; c <= fNumCategories; ++c)
    {
        const double moved = nextLeft.fCounts[c] - left.fCounts[c];
        if (moved == 0.0)
            continue;
        const double leftSlope = std::max(0.0, left.fLogs[0] - nextLeft.fLogs[c]);
        const double rightSlope = right.fLogs[0] - nextRight.fLogs[c];
        tangent += moved * std::min(0.0, leftSlope - rightSlope);
    }
    return std::max(tangent, left.fEntropy + nextRight.fEntropy);
}

/// Works out the candidates whose cut lies between the segment's boundaries.
void CutScan::TrySegment(std::size_t segment, Range range, Best& best) const
{
    const auto state = fStates.begin() + static_cast<std::ptrdiff_t>(segment * StateSize());
    const auto middle = state + static_cast<std::ptrdiff_t>(fNumCategories + 1);
    CountVector left(state, middle);
    CountVector right(middle, middle + static_cast<std::ptrdiff_t>(fNumCategories + 1));

    // A cut that leaves all rows before a boundary on the left is at the row before it, or at the first behind it.
    const int shift = fRightBorderClosed ? 1 : 0;
    const bool isLastSegment = segment + 1 == NumSegments();
    const int firstRow = std::max(fBoundaries[segment] - shift, range.fFirst);
    const int lastRow = isLastSegment ? range.fLast : fBoundaries[segment + 1] - shift - 1;
    TryRows({firstRow, lastRow}, range, fBoundaries[segment], left, right, best);
}
