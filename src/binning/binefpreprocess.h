#ifndef MCOBNQRT_BINEFPREPROCESS_H
#define MCOBNQRT_BINEFPREPROCESS_H

#include "data/binsorttuple.h"
#include "data/binvaluetuple.h"

#include <vector>

/// Cuts one attribute's sorted, weighted values into bins of about equal total weight: bin i ends where the share
/// (i + 1) / numberOfBins of the weight is reached. Equal values are never torn apart, so bins can end up heavier than
/// their share, and there can be fewer of them than asked for.
///
/// One object serves the attributes of a run one after the other and keeps nothing of one for the next. Tuples are only
/// read; their first `numTuples` elements are the attribute's, in rising order of value.
class BINEFPreProcess
{
public:
    BINEFPreProcess(int numberOfBins, bool rightBorderClosed);

    /// The cut list for pre-binning: at most numberOfBins - 1 values in strictly rising order, the value at an end of
    /// the data among them where that value alone holds a share. `cuts` arrives empty.
    ///
    /// \return false, with nothing changed, without tuples, bins or a total weight above 0.
    bool PreBinEqualFrequency(const std::vector<BINSortTuple>* tuples, unsigned int numTuples,
                              std::vector<double>& cuts, double totalWeight) const;

    /// The bins themselves: cut points in strictly rising order, and the weight of each bin, none of them 0, one more
    /// than there are cuts. The weights are those of the values between the cuts, whatever the values are. Both lists
    /// arrive empty.
    ///
    /// \return as PreBinEqualFrequency.
    bool BinEqualFrequency(const std::vector<BINValueTuple>* tuples, unsigned int numTuples, std::vector<double>& cuts,
                           std::vector<double>& counts, double totalWeight) const;

private:
    bool CanBin(unsigned int numTuples, double totalWeight) const;

    bool fRightBorderClosed;
    int fNumberOfBins;
};

#endif
