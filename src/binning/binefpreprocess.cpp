// Weighted percentiles in one walk over the sorted tuples.
//
// The walk takes whole groups of equal values. The target of a bin is either passed inside a group, and then the
// group's value is the cut, or met exactly between two groups, and then the midpoint of their values is. The total
// weight comes from a sum in another order than the walk's and may differ from it in the last bit, so "all of it" is
// asked of the tuples, by the cursor, and never of the weights.

#include "binning/binefpreprocess.h"

#include "platform/arithmetic.h"

#include <algorithm>
#include <cmath>
#include <cstddef>
#include <limits>

namespace
{

constexpr double kEpsilon = std::numeric_limits<double>::epsilon();

/// One walk over the tuples of an attribute, from its first bin to its last.
template<class Tuple>
class EFWalk
{
public:
    EFWalk(const std::vector<Tuple>& tuples, unsigned int numTuples, double totalWeight, int numberOfBins)
        : fTuples(tuples), fNumTuples(numTuples), fTotalWeight(totalWeight), fStep(100.0 / numberOfBins),
          fLastBin(numberOfBins - 1)
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
    void CountBin(bool rightBorderClosed, std::vector<double>& counts) const
    {
        if (rightBorderClosed)
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
                fCutPoint = (fTuples[fCursor - 1].fValue + groupValue) * 0.5;
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
    int fBin = -1;            ///< the bin that was closed last
    unsigned int fCursor = 0; ///< index of the next tuple not yet consumed
    double fCum = 0.0;        ///< weight of all tuples consumed
    double fPrevCum = 0.0;    ///< weight in front of the group looked at last
    double fCumAtStart = 0.0; ///< fCum and fPrevCum when the bin began
    double fPrevCumAtStart = 0.0;
    double fCumBeforeGroup = 0.0;
    double fCutPoint = 0.0;
};

/// A bin whose cut equals the one before it: the midpoint of two neighbouring doubles is one of them, and a target
/// inside its group gives it once more. The bin's weight then belongs to the bin before.
void JoinToPreviousBin(std::vector<double>& counts, std::size_t bin)
{
    counts[bin - 1] += counts[bin];
    counts.erase(counts.begin() + static_cast<std::ptrdiff_t>(bin));
}

/// Walks through all bins. With `counts` null the weights of the bins are not wanted.
template<class Tuple>
void FindBins(EFWalk<Tuple> walk, bool rightBorderClosed, std::vector<double>& cuts, std::vector<double>* counts)
{
    while (walk.NextEFCutPoint())
    {
        const std::size_t numCounts = counts != nullptr ? counts->size() : 0;
        if (counts != nullptr)
            walk.CountBin(rightBorderClosed, *counts);
        if (walk.IsLastBin())
            return;
        if (cuts.empty() || walk.GetCutPoint() != cuts.back())
            cuts.push_back(walk.GetCutPoint());
        else if (counts != nullptr)
            JoinToPreviousBin(*counts, numCounts);
    }
}

/// Takes out a cut at an end of the data, where a single value holds the last share or, with the left border closed,
/// the first. The bin that it cuts off has no weight, unless the cut is the midpoint of two neighbouring doubles, which
/// is one of them: then its weight goes to the bin beside it.
void RemoveCutAtEnd(double smallest, double largest, bool rightBorderClosed, std::vector<double>& cuts,
                    std::vector<double>& counts)
{
    if (cuts.empty())
        return;
    if (rightBorderClosed && cuts.back() == largest)
    {
        cuts.pop_back();
        if (counts.size() > cuts.size() + 1)
            JoinToPreviousBin(counts, counts.size() - 1);
    }
    else if (!rightBorderClosed && cuts.front() == smallest)
    {
        cuts.erase(cuts.begin());
        if (counts.size() > 1)
            JoinToPreviousBin(counts, 1);
        else
            counts.clear();
    }
}

/// Takes out the bins without weight, each with its right cut: no value lies between that and the cut before it.
void RemoveEmptyBins(double totalWeight, std::vector<double>& cuts, std::vector<double>& counts)
{
    if (cuts.empty() && counts.empty())
        counts.push_back(totalWeight);

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
        keptCuts.pop_back(); // the last bin was empty: the one before it has no right cut now
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
    FindBins(EFWalk<BINSortTuple>(*tuples, numTuples, totalWeight, fNumberOfBins), fRightBorderClosed, cuts, nullptr);
    return true;
}

bool BINEFPreProcess::BinEqualFrequency(const std::vector<BINValueTuple>* tuples, unsigned int numTuples,
                                        std::vector<double>& cuts, std::vector<double>& counts,
                                        double totalWeight) const
{
    if (tuples == nullptr || !CanBin(numTuples, totalWeight))
        return false;
    FindBins(EFWalk<BINValueTuple>(*tuples, numTuples, totalWeight, fNumberOfBins), fRightBorderClosed, cuts, &counts);
    RemoveCutAtEnd(tuples->front().fValue, (*tuples)[numTuples - 1].fValue, fRightBorderClosed, cuts, counts);
    RemoveEmptyBins(totalWeight, cuts, counts);
    return true;
}

bool BINEFPreProcess::CanBin(unsigned int numTuples, double totalWeight) const
{
    return fNumberOfBins > 0 && numTuples > 0 && 0.0 < totalWeight;
}
