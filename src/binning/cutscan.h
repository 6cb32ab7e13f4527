#ifndef MCOBNQRT_CUTSCAN_H
#define MCOBNQRT_CUTSCAN_H

#include "binning/entropy.h"

#include <cstddef>
#include <vector>

/// Finds the best cut in ranges of rows of one value table: R rows of K cells, the weights of an interval by target
/// code.
///
/// What it finds is what a walk over all rows would find that works out the partition entropy of every candidate. It
/// only leaves out candidates that can't be the best; how it knows them stands in cutscan.cpp.
class CutScan
{
public:
    static constexpr int kNoRow = -1;

    /// The table outlives the object.
    CutScan(const std::vector<double>& table, std::size_t numCategories, bool rightBorderClosed);

    /// The count vector of the rows `first` to `last`, both inclusive: each category summed in the order of the rows,
    /// and the total in the order of the categories.
    void SumRows(int first, int last, CountVector& counts) const;

    /// The candidate with the lowest partition entropy, the lowest row among equal ones, or kNoRow if all rows are pure
    /// in one and the same category. `left` arrives all zero and `right` with SumRows of the range; both leave with the
    /// two sides of the row. The range holds two rows at least.
    int FindBestCut(int first, int last, CountVector& left, CountVector& right);

    /// As FindBestCut, but only among the cuts that leave rows on both sides. Every one of them is worked out.
    int FindBestInnerCut(int first, int last, CountVector& left, CountVector& right) const;

    /// Whether a cut at `row` leaves rows of the range on both sides.
    bool IsInnerCut(int row, int first, int last) const { return LastLeftRow(row) >= first && LastLeftRow(row) < last; }

    /// The last row on the left of a cut at `row`: with the right border closed the row's own border is the cut, and
    /// the row lies on the left.
    int LastLeftRow(int row) const { return fRightBorderClosed ? row : row - 1; }

private:
    struct Best
    {
        int fRow = kNoRow;
        double fEntropy = 0.0;
    };

    struct Range
    {
        int fFirst;
        int fLast;
    };

    /// One side of a boundary: what its bound is made of.
    struct Side
    {
        CountVector fCounts;
        std::vector<double> fLogs; ///< to the base 2, of the counts
        double fEntropy = 0.0;     ///< times the weight

        void Set(const double* counts, std::size_t size);
    };

    /// The partition entropy, times the weight, of sides that change by a row at a time; only what the row moves is
    /// worked out.
    class Estimate
    {
    public:
        Estimate(const CountVector& left, const CountVector& right);
        void Update(std::size_t category, double leftCount, double rightCount);
        double Of(double leftWeight, double rightWeight) const;

    private:
        std::vector<double> fLeftTerms; ///< by category: count times its logarithm
        std::vector<double> fRightTerms;
        double fSum = 0.0;
    };

    const double* Row(int row) const { return fTable.data() + static_cast<std::size_t>(row) * fNumCategories; }
    bool IsSamePurePair(int row) const;
    bool IsCandidate(int row, Range range) const;
    void AddRows(int first, int last, double* categories) const;
    void MoveRows(int first, int last, CountVector& left, CountVector& right) const;
    static void TryRow(int row, const CountVector& left, const CountVector& right, Best& best);
    void TryRows(int firstRow, int lastRow, Range range, CountVector& left, CountVector& right, Best& best) const;
    void SumSides(int row, Range range, const CountVector& totals, CountVector& left, CountVector& right) const;

    void CountBlocks();
    void CountRowsBefore(int row, double* categories) const;
    bool CanBeBounded(Range range, double weight) const;
    double Margin(Range range, double weight) const;
    Best FindBounded(Range range, const CountVector& totals);
    void FindStates(Range range, const CountVector& totals);
    std::size_t FindBounds();
    static bool IsAllNaN(const Side& right, const Side& nextRight);
    double BoundOf(const Side& left, const Side& right, const Side& nextLeft, const Side& nextRight) const;
    void TrySegment(std::size_t segment, Range range, double margin, Best& best) const;
    void MoveRow(int row, CountVector& left, CountVector& right, Estimate& estimate) const;

    std::size_t NumSegments() const { return fBoundaries.size() - 1; }
    std::size_t StateSize() const { return 2 * (fNumCategories + 1); }

    const std::vector<double>& fTable;
    std::size_t fNumCategories;
    bool fRightBorderClosed;
    int fBlockSize;             ///< rows of a segment
    bool fIsExact = false;      ///< all sums of cells are exact: any order of additions gives the same
    double fSmallestCell = 0.0; ///< of those above 0
    std::vector<double>
        fRowsBefore; ///< of an exact table, for each block: the counts of all rows before it, by category

    // Of the range at hand, which is dealt with in segments.
    std::vector<int> fBoundaries; ///< the first row of each segment, and the row behind the last segment
    std::vector<double> fStates;  ///< by boundary: both count vectors when all rows before it are on the left
    std::vector<double> fBounds;  ///< by segment: no candidate in it has a lower partition entropy, times the weight
};

#endif
