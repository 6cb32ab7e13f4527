#ifndef MCOBNQRT_BINOUTPUT_H
#define MCOBNQRT_BINOUTPUT_H

#include <mcobnqrt/binattributetargetresults.h>
#include <mcobnqrt/export.h>
#include <mcobnqrt/mcstatus.h>

#include <iosfwd>
#include <map>
#include <set>
#include <utility>
#include <vector>

/// The results of a supervised algorithm. The algorithm adds an entry for each attribute and target that it treats; the
/// host reads them when Run has returned. Entries are never removed or replaced: binning a pair again adds a second
/// one.
///
/// What a getter hands over is the host's own copy. An operation that throws, for want of memory, has changed neither
/// the store nor what it was to fill.
class MCOBNQRT_EXPORT BINOutput
{
public:
    BINOutput();
    BINOutput(const BINOutput& other);
    BINOutput& operator=(const BINOutput& other);
    virtual ~BINOutput();

    /// Adds the entry of one pair; what `status` says about the pair makes no difference to the operation. `cellCounts`
    /// holds the rows of the entry's table one behind the other, one row for each bin, all of the same length; a rest
    /// that doesn't fill a whole column of the table is dropped.
    ///
    /// \return OK, or the error BINStatusIndexOutOfRange, and nothing is added, if an index is negative or both are
    ///         equal.
    MCBinning::MCStatus SetAttributeTargetResults(MCBinning::MCStatus status, const std::set<double>& cutPoints,
                                                  const std::vector<double>& cellCounts, int attribute, int target,
                                                  unsigned int numDistinctValues, double totalWeight,
                                                  double totalWeightWithMissing, double minimum, double maximum,
                                                  double modelEntropy);

    /// Copies the first entry of the pair to `results`.
    ///
    /// \return the status of that entry, or the error BINStatusIndexOutOfRange, and `results` is as before, if there is
    ///         none.
    MCBinning::MCStatus GetAttributeTargetCutPoints(int attribute, int target,
                                                    BINAttributeTargetResults& results) const;

    /// Appends all entries of the attribute to `results`, whatever the target, in the order in which they came.
    ///
    /// \return the status of the last of them, or the error BINStatusIndexOutOfRange, and `results` is as before, if
    ///         there is none.
    MCBinning::MCStatus GetAttributeCutPoints(int attribute, std::vector<BINAttributeTargetResults>& results) const;

    /// Replaces `results` by all entries, in the order in which they came.
    ///
    /// \return OK, whatever the entries' own statuses are, or the error BINStatusNoResults, and `results` is as before,
    ///         if the store is empty.
    MCBinning::MCStatus GetAllCutPoints(std::vector<BINAttributeTargetResults>& results) const;

    /// Dumps all entries for a programmer's eye.
    virtual void Display(std::ostream& os) const;

private:
    /// In the order of storing.
    std::vector<BINAttributeTargetResults> fResults;
    /// By attribute and target: the index in fResults of the first entry of that pair.
    std::map<std::pair<int, int>, int> fResultIndex;
    /// By attribute: the indices in fResults of its entries, in the order of storing.
    std::map<int, std::vector<int>> fAttributeIndex;
};

#endif
