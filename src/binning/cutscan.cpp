// To work out the partition entropy of a candidate takes 2 K logarithms, and few candidates can be the best. So a range
// is cut into segments, and a segment is left out when a bound for all its candidates is above the best one found.
//
// The bound. Let H(v) = v0 log2 v0 - sum over c of vc log2 vc be the entropy of a count vector times its weight. H is
// concave and of degree one, so it is superadditive, and at a boundary with the sides L and R, for any candidate
// between it and the next boundary, which moves m from R to L, 0 <= m <= M:
//
//     H(L + m) + H(R - m)  >=  H(L) + H(R) + sum over c of mc (log2(L'0 / L'c) - log2(R'0 / R'c))       (a)
//     H(L + m) + H(R - m)  >=  H(L) + H(R - M)                                                          (b)
//
// (a) is the tangent at the new sides L' = L + m and R' = R - m. With L'0 >= L0, L'c <= Lc + Mc, L'c <= L'0, R'0 <= R0
// and R'c >= Rc - Mc the bracket is at least bc = max(0, log2(L0 / (Lc + Mc))) - log2(R0 / (Rc - Mc)), and mc bc at
// least Mc min(0, bc). All logarithms are those of the two boundaries. The larger of (a) and (b) is taken.
//
// In a segment that is left, the same quantity is kept up to date row by row from the logarithms of what a row moves,
// mostly 4 of them, and only rows for which it is not above the best one are worked out.
//
// The margin. What is compared with bound and estimate is the partition entropy as it is worked out, times the weight
// N. With u = 2^-53, an entropy is off by at most (40 + 8 K) u. Each term v log2 v of bound and estimate is at most
// N (|log2 N| + 1) in size. Bounds are only used where N is between 2^-60 and 2^60, so that is at most 61 N; the bound
// has 4 (K + 1) terms, and the estimate is updated up to 64 K times in a segment, each time off by at most 6 x 61 u N:
// 2^15 (K + 4) u N is enough for all of it. Beyond those weights the terms grow with |log2 N| and no such margin holds;
// from a total of about 2^1014 they are infinite, and at the small end they lose their last bits.
//
// That is all where sums are exact. Otherwise the sides are running sums of n rows, each off by up to e = 2 n K u N, a
// residual of a category that is used up among them. No partial sum is finer than the last bit of the smallest cell, so
// no count is below 2^-g N with g = log2(N / smallest cell) + 54, and no logarithm is above g + 60 in size. An error of
// e in each count of both sides then moves their H, of 2 (K + 1) terms v log2 v, by at most 2 (K + 1) (g + 62) e, and
// that is at most 2 K (3 g + 16) e, as g is above 54 and K above 1: with one category H is 0.
//
// For a million rows of three categories this takes a scan from 60 ms to less than one where sums are exact, and to 5
// where they are not and rows have to be summed one by one.

#include "binning/cutscan.h"

#include "base/exactsums.h"
#include "platform/arithmetic.h"

#include <algorithm>
#include <cmath>
#include <functional>
#include <limits>
#include <numeric>

namespace
{

// Rows of a segment. What a bound gives away grows with the square of the segment's share of the rows: in a small table
// long segments are seldom left out, and in a large one short ones cost more than they save.
constexpr int kLongBlock = 64;
constexpr int kShortBlock = 16;
constexpr int kFewestRowsForLongBlocks = 40000; ///< of the table

/// Ranges with fewer blocks are walked over: the bounds cost as much as they save.
constexpr int kFewestBoundedBlocks = 4;

constexpr double kLargestSpread = 4294967296.0; ///< of sums that are not exact; beyond it the margin is useless
constexpr double kHeaviestRange = 1152921504606846976.0; ///< 2^60
constexpr double kLightestRange = 1.0 / kHeaviestRange;

/// 0 log2 0 is 0 here, as in an entropy.
double Times(double count, double log2)
{
    return count == 0.0 ? 0.0 : count * log2;
}

double TimesLog(double count)
{
    return Times(count, std::log2(count));
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
    : fTable(table), fNumCategories(numCategories), fRightBorderClosed(rightBorderClosed),
      fBlockSize(table.size() / numCategories < kFewestRowsForLongBlocks ? kShortBlock : kLongBlock)
{
    if (fTable.size() >= static_cast<std::size_t>(kFewestBoundedBlocks * fBlockSize) * fNumCategories)
        CountBlocks();
}

/// Adds up the table block by block, and finds out what its sums are like.
void CutScan::CountBlocks()
{
    const int numRows = static_cast<int>(fTable.size() / fNumCategories);
    std::vector<double> counts(fNumCategories, 0.0);
    for (int row = 0; row < numRows; ++row)
    {
        if (row % fBlockSize == 0)
            fRowsBefore.insert(fRowsBefore.end(), counts.begin(), counts.end());
        const double* const cells = Row(row);
        for (std::size_t c = 0; c < fNumCategories; ++c) counts[c] += cells[c];
    }
    ExactSums sums(std::accumulate(counts.begin(), counts.end(), 0.0));
    for (const double cell : fTable) sums.Add(cell);
    fIsExact = sums.AreExact();
    if (fIsExact)
        return;
    fSmallestCell = std::numeric_limits<double>::infinity();
    for (const double cell : fTable) // without a branch, since no processor predicts which cells are 0
        fSmallestCell = std::min(fSmallestCell, cell > 0.0 ? cell : std::numeric_limits<double>::infinity());
}

/// The counts of all rows before `row`, of an exact table.
void CutScan::CountRowsBefore(int row, double* categories) const
{
    const int block = std::min(row / fBlockSize, static_cast<int>(fRowsBefore.size() / fNumCategories) - 1);
    const auto before =
        fRowsBefore.begin() + static_cast<std::ptrdiff_t>(static_cast<std::size_t>(block) * fNumCategories);
    std::copy(before, before + static_cast<std::ptrdiff_t>(fNumCategories), categories);
    AddRows(block * fBlockSize, row - 1, categories);
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
        TryRows(first, last, range, left, right, best);
    if (best.fRow != kNoRow)
        SumSides(best.fRow, range, totals, left, right);
    return best.fRow;
}

int CutScan::FindBestInnerCut(int first, int last, CountVector& left, CountVector& right) const
{
    const Range range{first, last};
    const CountVector totals = right;
    Best best;
    if (fRightBorderClosed)
        TryRows(first, last - 1, range, left, right, best);
    else
        TryRows(first + 1, last, range, left, right, best);
    if (best.fRow != kNoRow)
        SumSides(best.fRow, range, totals, left, right);
    return best.fRow;
}

/// After a scan the sides are those of another row, with the roundings of all subtractions. The shorter one is summed
/// afresh, the other is what it leaves of the totals.
void CutScan::SumSides(int row, Range range, const CountVector& totals, CountVector& left, CountVector& right) const
{
    const bool isLeftShorter = (static_cast<double>(range.fFirst) + range.fLast) * 0.5 >= row;
    CountVector& summed = isLeftShorter ? left : right;
    CountVector& rest = isLeftShorter ? right : left;
    if (isLeftShorter)
        SumRows(range.fFirst, LastLeftRow(row), summed);
    else
        SumRows(LastLeftRow(row) + 1, range.fLast, summed);
    std::transform(totals.begin(), totals.end(), summed.begin(), rest.begin(), std::minus<>());
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

/// Candidates are both rows of each pair of neighbours that is not pure in one and the same category.
bool CutScan::IsCandidate(int row, Range range) const
{
    return (row < range.fLast && !IsSamePurePair(row)) || (row > range.fFirst && !IsSamePurePair(row - 1));
}

/// Moves rows from the right side to the left, row by row. Sums are defined by this order of additions.
/// More than one row lies between two candidates only where all of these rows are pure in one category.
void CutScan::MoveRows(int first, int last, CountVector& left, CountVector& right) const
{
    double leftWeight = left[0]; // apart from the vectors, so that they stay in registers
    double rightWeight = right[0];
    for (int row = first; row <= last; ++row)
    {
        const double* const cells = Row(row);
        for (std::size_t c = 0; c < fNumCategories; ++c)
        {
            leftWeight += cells[c];
            left[c + 1] += cells[c];
            rightWeight -= cells[c];
            right[c + 1] -= cells[c];
        }
    }
    left[0] = leftWeight;
    right[0] = rightWeight;
}

/// Works out every candidate from `firstRow` to `lastRow`.
void CutScan::TryRows(int firstRow, int lastRow, Range range, CountVector& left, CountVector& right, Best& best) const
{
    int nextRow = range.fFirst;
    for (int row = firstRow; row <= lastRow; ++row)
    {
        if (!IsCandidate(row, range))
            continue;
        // Both count vectors run forward with the candidate, so each row is moved once: linear in rows, not quadratic.
        MoveRows(nextRow, LastLeftRow(row), left, right);
        nextRow = LastLeftRow(row) + 1;
        TryRow(row, left, right, best);
    }
}

void CutScan::TryRow(int row, const CountVector& left, const CountVector& right, Best& best)
{
    const double entropy = PartitionEntropy(left, right);
    // A NaN never replaces a best, and a NaN that came first is never replaced.
    if (best.fRow == kNoRow || best.fEntropy > entropy || (best.fEntropy == entropy && row < best.fRow))
        best = {row, entropy};
}

bool CutScan::CanBeBounded(Range range, double weight) const
{
    const bool isLongEnough = range.fLast - range.fFirst + 1 >= kFewestBoundedBlocks * fBlockSize;
    const bool hasFiniteTerms = kLightestRange < weight && weight < kHeaviestRange;
    return isLongEnough && hasFiniteTerms && (fIsExact || weight < kLargestSpread * fSmallestCell);
}

double CutScan::Margin(Range range, double weight) const
{
    constexpr double kUnit = std::numeric_limits<double>::epsilon() / 2;
    const auto numCategories = static_cast<double>(fNumCategories);
    const double ofEntropies = 32768.0 * (numCategories + 4.0) * kUnit * weight;
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
    const double weight = totals[0];
    const double margin = Margin(range, weight);
    Best best;
    // In order up to the first candidate: if that is a NaN, it stays.
    std::size_t segment = 0;
    for (; segment < NumSegments() && best.fRow == kNoRow; ++segment) TrySegment(segment, range, margin, best);
    if (best.fRow == kNoRow || std::isnan(best.fEntropy))
        return best;

    TrySegment(promising, range, margin, best);
    for (; segment < NumSegments(); ++segment)
    {
        if (!(fBounds[segment] > best.fEntropy * weight + margin))
            TrySegment(segment, range, margin, best);
    }
    return best;
}

/// Sets the boundaries of a range, at whole blocks, and the sides at each of them.
void CutScan::FindStates(Range range, const CountVector& totals)
{
    fBoundaries.assign(1, range.fFirst);
    for (int row = (range.fFirst / fBlockSize + 1) * fBlockSize; row <= range.fLast; row += fBlockSize)
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
        fBounds[segment] = IsAllNaN(right, nextRight) ? std::numeric_limits<double>::infinity()
                                                      : BoundOf(left, right, nextLeft, nextRight);
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

/// Whether no candidate of a segment can be the best, as each one's partition entropy is a NaN: with fractions the
/// subtractions can leave less than nothing of a category on the right. It stays so, since rows hold nothing below 0
/// and rounding keeps order; for the same reason the weight of the right side is above 0 at every row if it is at the
/// next boundary. So the category's share is below 0 throughout, and not too small for a double: a residual is no finer
/// than the last bit of the smallest cell, and the weight less than 2^32 such cells.
bool CutScan::IsAllNaN(const Side& right, const Side& nextRight)
{
    return nextRight.fCounts[0] > 0.0 &&
           std::any_of(right.fCounts.begin() + 1, right.fCounts.end(), [](double count) { return count < 0.0; });
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
        // A residual below 0 makes this NaN, and so the bound, which then leaves nothing out.
        if (!(leftSlope >= rightSlope))
            tangent += moved * (leftSlope - rightSlope);
    }
    return std::max(tangent, left.fEntropy + nextRight.fEntropy);
}

/// Works out the candidates whose cut lies between the segment's boundaries, but for those that an estimate leaves out.
void CutScan::TrySegment(std::size_t segment, Range range, double margin, Best& best) const
{
    const auto state = fStates.begin() + static_cast<std::ptrdiff_t>(segment * StateSize());
    const auto middle = state + static_cast<std::ptrdiff_t>(fNumCategories + 1);
    CountVector left(state, middle);
    CountVector right(middle, middle + static_cast<std::ptrdiff_t>(fNumCategories + 1));
    Estimate estimate(left, right);
    const double weight = left[0] + right[0];

    // A cut that leaves all rows before a boundary on the left is at the row before it, or at the first behind it.
    const int shift = fRightBorderClosed ? 1 : 0;
    const bool isLastSegment = segment + 1 == NumSegments();
    const int firstRow = std::max(fBoundaries[segment] - shift, range.fFirst);
    const int lastRow = isLastSegment ? range.fLast : fBoundaries[segment + 1] - shift - 1;
    int nextRow = fBoundaries[segment];
    for (int row = firstRow; row <= lastRow; ++row)
    {
        for (; nextRow <= LastLeftRow(row); ++nextRow) MoveRow(nextRow, left, right, estimate);
        // The comparison is false for an estimate that is a NaN, so that it leaves nothing out.
        const bool isHopeless = best.fRow != kNoRow && estimate.Of(left[0], right[0]) > best.fEntropy * weight + margin;
        if (!isHopeless && IsCandidate(row, range))
            TryRow(row, left, right, best);
    }
}

void CutScan::MoveRow(int row, CountVector& left, CountVector& right, Estimate& estimate) const
{
    const double* const cells = Row(row);
    for (std::size_t c = 0; c < fNumCategories; ++c)
    {
        if (cells[c] == 0.0)
            continue;
        left[0] += cells[c];
        left[c + 1] += cells[c];
        right[0] -= cells[c];
        right[c + 1] -= cells[c];
        estimate.Update(c, left[c + 1], right[c + 1]);
    }
}

CutScan::Estimate::Estimate(const CountVector& left, const CountVector& right)
    : fLeftTerms(left.size() - 1, 0.0), fRightTerms(left.size() - 1, 0.0)
{
    for (std::size_t c = 0; c < fLeftTerms.size(); ++c) Update(c, left[c + 1], right[c + 1]);
}

void CutScan::Estimate::Update(std::size_t category, double leftCount, double rightCount)
{
    const double leftTerm = TimesLog(leftCount);
    const double rightTerm = TimesLog(rightCount);
    fSum += (leftTerm - fLeftTerms[category]) + (rightTerm - fRightTerms[category]);
    fLeftTerms[category] = leftTerm;
    fRightTerms[category] = rightTerm;
}

double CutScan::Estimate::Of(double leftWeight, double rightWeight) const
{
    return TimesLog(leftWeight) + TimesLog(rightWeight) - fSum;
}
