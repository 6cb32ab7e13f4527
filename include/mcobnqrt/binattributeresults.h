#ifndef MCOBNQRT_BINATTRIBUTERESULTS_H
#define MCOBNQRT_BINATTRIBUTERESULTS_H

#include <mcobnqrt/export.h>
#include <mcobnqrt/mccommon.h>
#include <mcobnqrt/mcstatus.h>

#include <cstdint>
#include <iosfwd>
#include <vector>

/// What an equal-frequency run found for one attribute. Only an EFBINOutput fills one; a host makes an empty one, or a
/// vector of them, for the store to copy into. It is a value, without a virtual destructor, and no base for other
/// classes.
///
/// Look at GetStatus() first. With a warning the figures hold, as far as there are any. With an error there are no cut
/// points, and the weights and the number of distinct values are 0; where the attribute was refused from the start the
/// minimum and the maximum are 0.0 too.
class MCOBNQRT_EXPORT BINAttributeResults final
{
public:
    const MCBinning::MCStatus& GetStatus() const { return fStatus; }

    /// A variable index; -1 in an object that no store has filled.
    int GetAttributeIndex() const { return fAttributeIndex; }

    /// In ascending order, each once. Whether a cut point belongs to the bin on its left or on its right is said by
    /// IsRightBorderClosed() of the settings.
    const std::vector<double>& GetCutPoints() const { return fCutPoints; }

    /// The weight of each bin, in ascending order: one more than there are cut points, or none where nothing was
    /// binned.
    const std::vector<double>& GetCellCounts() const { return fCellCounts; }

    /// How many different valid values of the attribute there are.
    unsigned int GetNDistinctValues() const { return fNDistinctValues; }

    /// The weight of the records that have a valid value of the attribute.
    double GetTotalWeight() const { return fTotalWeight; }

    /// The weight of all records, valid or missing; those without a weight above 0 count nowhere.
    double GetTotalWeightWithMissing() const { return fTotalWeightWithMissing; }

    /// The smallest and the largest valid value; gMissingValue if there is none.
    double GetMinimum() const { return fMinimum; }
    double GetMaximum() const { return fMaximum; }

    /// Dumps the result for a programmer's eye.
    virtual void Display(std::ostream& os) const;

private:
    friend class EFBINOutput;

    MCBinning::MCStatus fStatus;
    int fAttributeIndex = -1;
    std::vector<double> fCutPoints;
    std::vector<double> fCellCounts;
    std::uint32_t fNDistinctValues = 0;
    double fTotalWeight = MCMV::gMissingValue;
    double fTotalWeightWithMissing = MCMV::gMissingValue;
    double fMinimum = MCMV::gMissingValue;
    double fMaximum = MCMV::gMissingValue;
};

#endif
