#ifndef MCOBNQRT_BINATTRIBUTETARGETRESULTS_H
#define MCOBNQRT_BINATTRIBUTETARGETRESULTS_H

#include <mcobnqrt/export.h>
#include <mcobnqrt/mccommon.h>
#include <mcobnqrt/mcstatus.h>

#include <cstdint>
#include <iosfwd>
#include <vector>

/// What a supervised run found for one attribute and target. Only a BINOutput fills one; a host makes an empty one, or
/// a vector of them, for the store to copy into. It is a value, without a virtual destructor, and no base for other
/// classes.
///
/// Look at GetStatus() first. With a warning the figures hold, as far as there are any. With an error there are no cut
/// points; where no binning was tried the weights and the number of distinct values are 0, and where the pair was
/// refused from the start the minimum, the maximum and the model entropy are 0.0 too.
class MCOBNQRT_EXPORT BINAttributeTargetResults final
{
public:
    const MCBinning::MCStatus& GetStatus() const { return fStatus; }

    /// Variable indices; -1 in an object that no store has filled.
    int GetAttributeIndex() const { return fAttributeIndex; }
    int GetTargetIndex() const { return fTargetIndex; }

    /// In ascending order, each once. Whether a cut point belongs to the bin on its left or on its right is said by
    /// IsRightBorderClosed() of the settings.
    const std::vector<double>& GetCutPoints() const { return fCutPoints; }

    /// One row per bin, in ascending order: first the weight of the bin, then its weight in each category of the
    /// target, by code from 0. There is a row more than there are cut points. The rows are empty where nothing was
    /// binned. A bin can weigh 0 if the attribute was pre-binned: a pre-bin without a value is cut off where the
    /// threshold of the criterion is negative, at a weight below 2, or so small beside a weight of some 1e16 and more
    /// that a gain of rounding alone exceeds it.
    const std::vector<std::vector<double>>& GetCellCounts() const { return fCellCounts; }

    /// How many different values of the attribute there are among the records that GetTotalWeight() counts.
    unsigned int GetNDistinctValues() const { return fNDistinctValues; }

    /// The weight of the records that have a valid value of both the attribute and the target.
    double GetTotalWeight() const { return fTotalWeight; }

    /// The weight of all records, valid or missing; those without a weight above 0 count nowhere.
    double GetTotalWeightWithMissing() const { return fTotalWeightWithMissing; }

    /// The smallest and the largest valid value; gMissingValue if there is none.
    double GetMinimum() const { return fMinimum; }
    double GetMaximum() const { return fMaximum; }

    /// The target's entropy that is left within the bins, in bits; gMissingValue if it wasn't worked out.
    double GetModelEntropy() const { return fModelEntropy; }

    /// Dumps the result for a programmer's eye.
    virtual void Display(std::ostream& os) const;

private:
    friend class BINOutput;

    MCBinning::MCStatus fStatus;
    int fAttributeIndex = -1;
    int fTargetIndex = -1;
    std::vector<double> fCutPoints;
    std::vector<std::vector<double>> fCellCounts;
    std::uint32_t fNDistinctValues = 0;
    double fTotalWeight = MCMV::gMissingValue;
    double fTotalWeightWithMissing = MCMV::gMissingValue;
    double fMinimum = MCMV::gMissingValue;
    double fMaximum = MCMV::gMissingValue;
    double fModelEntropy = MCMV::gMissingValue;
};

#endif
