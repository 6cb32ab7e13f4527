// Weighted percentiles in one walk over the sorted tuples.
//
// The walk takes whole groups of equal values. The target of a bin is either passed inside a group, and then the
// group's value is the cut, or met exactly between two groups, and then the midpoint of their values is, or where that
// doesn't part the two, the one of them that does. The total weight comes from a sum in another order than the walk's
// and may differ from it in the last bit, so the walk is at its end when the cursor has passed all tuples, and not when
// the weight is reached.

#include "binning/binefpreprocess.h"

#include "platform/arithmetic.h"

#include <algorithm>
#include <cmath>
#include <cstddef>
#include <limits>

namespace
{

constexpr double kEpsilon = std::numeric_limits<double>::epsilon();

/// A cut between two values, `lower` < `upper`, that leaves the one on its left and the other on its right: the
/// midpoint if possible. That of two neighbouring doubles is one of the two, and beside infinities it can be infinite
/// or a NaN.
double CutBetween(double lower, double upper, bool rightBorderClosed)
{
    const double sum = lower + upper;
    const double middle = std::isfinite(sum) ? sum * 0.5 : lower * 0.5 + upper * 0.5; // the sum of large ones overflows
    if (rightBorderClosed)
        return lower <= middle && middle < upper ? middle : lower;
    return lower < middle && middle <= upper ? middle : upper;
}

/// One walk over the tuples of an attribute, from its first bin to its last.
template<class Tuple>
class EFWalk
{
public:
    EFWalk(const std::vector<Tuple>& tuples, unsigned int numTuples, double totalWeight, int numberOfBins,
           bool rightBorderClosed)
        : fTuples(tuples), fNumTuples(numTuples), fTotalWeight(totalWeight), fStep(100.0 / numberOfBins),
          fLastBin(numberOfBins - 1), fRightBorderClosed(rightBorderClosed)
    {
    }

    /// Goes on to the next bin whose target is not passed yet. False behind the last bin and the last tuple.
    bool NextEFCutPoint()
    {
        if (HasConsumedAll() || fBin == fLastBin)
            return false;
        fBin = FirstBinNotPassed();
        fCumAtStart = fCum;
        fPrevCumAtStart = fPrevCum;
        ScanToTarget(Need(fBin));
        fPrevCum = fCumBeforeGroup;
        return true;
    }

    /// The right end of the bin; of no use for the last one.
    double GetCutPoint() const { return fCutPoint; }
    bool IsLastBin() const { return fBin == fLastBin; }

    /// Appends the weight of the bin. With the right border closed the group at the cut belongs to it, else to the next
    /// bin; where that group is the last of all, the next bin is complete too, and no call will come that could count
    /// it.
    void CountBin(std::vector<double>& counts) const
    {
        if (fRightBorderClosed)
            counts.push_back(fCum - fCumAtStart);
        else if (IsLastBin())
            counts.push_back(fCum - fPrevCumAtStart);
        else
        {
            counts.push_back(fCumBeforeGroup - fPrevCumAtStart);
            if (HasConsumedAll() && fCumBeforeGroup != 0.0)
                counts.push_back(fCum - fCumBeforeGroup);
        }
    }

private:
    /// The weight at which a bin ends.
    double Need(int bin) const
    {
        return bin == fLastBin ? fTotalWeight : std::min((bin + 1.0) * fStep, 100.0) / 100.0 * fTotalWeight;
    }

    /// Targets rise with the bins, so those that one heavy group has passed are found by halving, however many they
    /// are. The first bin is never passed, not even with a target too small to be told from 0.
    int FirstBinNotPassed() const
    {
        int first = fBin + 1;
        int last = fCursor == 0 ? first : fLastBin;
        while (first < last)
        {
            const int middle = first + (last - first) / 2;
            if (fCum < Need(middle))
                last = middle;
            else
                first = middle + 1;
        }
        return first;
    }

    bool HasConsumedAll() const { return fCursor == fNumTuples; }

    void ScanToTarget(double need)
    {
        do
        {
            const double groupValue = fTuples[fCursor].fValue;
            fCumBeforeGroup = fCum;
            if (IsMet(need))
            {
                fCutPoint = CutBetween(fTuples[fCursor - 1].fValue, groupValue, fRightBorderClosed);
                return;
            }
            fCutPoint = groupValue;
            ConsumeGroup(groupValue);
        } while (!HasConsumedAll() && (IsLastBin() || !IsPassed(need)));
    }

    bool IsMet(double need) const { return std::abs(fCum - need) / (fCum < need ? need : fCum) < kEpsilon; }

    bool IsPassed(double need) const { return !(fCum < need) && !(std::abs(fCum - need) / fCum < kEpsilon); }

    void ConsumeGroup(double value)
    {
        for (; !HasConsumedAll() && fTuples[fCursor].fValue == value; ++fCursor) fCum += fTuples[fCursor].fWeight;
    }

    const std::vector<Tuple>& fTuples;
    unsigned int fNumTuples;
    double fTotalWeight;
    double fStep; ///< share of one bin, in percent
    int fLastBin;
    bool fRightBorderClosed;
    int fBin = -1;            ///< the bin that was closed last
    unsigned int fCursor = 0; ///< index of the next tuple not yet consumed
    double fCum = 0.0;        ///< weight of all tuples consumed
    double fPrevCum = 0.0;    ///< weight in front of the group looked at last
    double fCumAtStart = 0.0; ///< fCum and fPrevCum when the bin began
    double fPrevCumAtStart = 0.0;
    double fCumBeforeGroup = 0.0;
    double fCutPoint = 0.0;
};

/// Walks through all bins. With `counts` null the weights of the bins are not wanted. A cut that equals the one before
/// it bounds a bin without a value, and so does one at the end of the data, where a single value holds the last share
/// or, with the left border closed, the first.
template<class Tuple>
void FindBins(EFWalk<Tuple> walk, std::vector<double>& cuts, std::vector<double>* counts)
{
    while (walk.NextEFCutPoint())
    {
        if (counts != nullptr)
            walk.CountBin(*counts);
        if (walk.IsLastBin())
            return;
        cuts.push_back(walk.GetCutPoint());
    }
}

/// Takes out the bins without weight, each with its right cut: no value lies between that and the cut before it.
void RemoveEmptyBins(double totalWeight, std::vector<double>& cuts, std::vector<double>& counts)
{
    std::vector<double> keptCuts;
    std::vector<double> keptCounts;
    for (std::size_t bin = 0; bin < counts.size(); ++bin)
    {
        if (counts[bin] == 0.0)
            continue;
        keptCounts.push_back(counts[bin]);
        if (bin < cuts.size())
            keptCuts.push_back(cuts[bin]);
    }
    if (keptCuts.size() == keptCounts.size() && !keptCuts.empty())
        keptCuts.pop_back(); // no value lies behind the last cut
    if (keptCounts.empty())
        keptCounts.push_back(totalWeight); // a single value, with the left border closed: all lies behind the last cut
    cuts.swap(keptCuts);
    counts.swap(keptCounts);
}

} // namespace

BINEFPreProcess::BINEFPreProcess(int numberOfBins, bool rightBorderClosed)
    : fRightBorderClosed(rightBorderClosed), fNumberOfBins(numberOfBins)
{
}

bool BINEFPreProcess::PreBinEqualFrequency(const std::vector<BINSortTuple>* tuples, unsigned int numTuples,
                                           std::vector<double>& cuts, double totalWeight) const
{
    if (tuples == nullptr || !CanBin(numTuples, totalWeight))
        return false;
    FindBins(EFWalk<BINSortTuple>(*tuples, numTuples, totalWeight, fNumberOfBins, fRightBorderClosed), cuts, nullptr);
    cuts.erase(std::unique(cuts.begin(), cuts.end()), cuts.end());
    return true;
}

bool BINEFPreProcess::BinEqualFrequency(const std::vector<BINValueTuple>* tuples, unsigned int numTuples,
                                        std::vector<double>& cuts, std::vector<double>& counts,
                                        double totalWeight) const
{
    if (tuples == nullptr || !CanBin(numTuples, totalWeight))
        return false;
    FindBins(EFWalk<BINValueTuple>(*tuples, numTuples, totalWeight, fNumberOfBins, fRightBorderClosed), cuts, &counts);
    RemoveEmptyBins(totalWeight, cuts, counts);
    return true;
}

bool BINEFPreProcess::CanBin(unsigned int numTuples, double totalWeight) const
{
    return fNumberOfBins > 0 && numTuples > 0 && 0.0 < totalWeight;
}
