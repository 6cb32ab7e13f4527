#ifndef MCOBNQRT_BINALGORITHM_H
#define MCOBNQRT_BINALGORITHM_H

#include "binning/binningdriver.h"

#include <mcobnqrt/binoutput.h>
#include <mcobnqrt/binsettings.h>
#include <mcobnqrt/ibinalgorithm.h>

#include <iosfwd>
#include <set>
#include <vector>

class BINEFPreProcess;

/// The driver of supervised runs: has the records read once, takes each pair of attribute and target in turn, has its
/// cut points found, and stores what was found.
///
/// The run is in binalgorithm.cpp and the steps from the tuples of one pair to its bins are in attributebinning.cpp.
/// What these steps work out is in functions: the tallies in tally.h, the cut points in entropysplit.h, the bins in
/// celltable.h. These shapes, all of doubles, go through them, K being the number of the target's categories:
///
///     value table   R rows of K cells, one row for each interval of values in rising order: weight by target code
///     row values    R borders, one for each row: its right border if that is closed, else its left border
///     count vector  K + 1 cells: the total weight, then the weight by target code
///     cell table    one count vector for each bin of the result
class BINAlgorithm : public BinningDriver<IBINAlgorithm, BINSettings, BINOutput>
{
public:
    BINAlgorithm(const BINSettings& settings, const BINVarList& varList, Platform* platform = SystemPlatform());
    ~BINAlgorithm() override;

    MCBinning::MCStatus Run(IBINRecordSource* source, const std::vector<int>* attributes,
                            const std::vector<int>* targets) override;
    void Display(std::ostream& os) override;

    /// Bins the current pair with each distinct value of the attribute as a row.
    ///
    /// The cut points and the cell table arrive empty, the model entropy as not found. Without a cut point there is one
    /// bin, with the warning BINStatusNoCutPoints. If the tuples don't fit the rows (a value beyond the largest finite
    /// double), the warning BINStatusBadBinTable comes back, and nothing is filled.
    MCBinning::MCStatus BinAttributeDirect(const std::vector<BINSortTuple>* tuples, std::set<double>& cutPoints,
                                           std::vector<double>& cells, double& modelEntropy);

    /// As BinAttributeDirect, with the bins of an equal-frequency cut list as rows. The list is worked on in place.
    MCBinning::MCStatus BinAttributePreBinned(const std::vector<BINSortTuple>* tuples, std::vector<double>& cuts,
                                              std::set<double>& cutPoints, std::vector<double>& cells,
                                              double& modelEntropy);

    /// As the function of that name, with the closed side of the run and the categories of the current pair. Null for
    /// values or table is the error BINStatusBadBinTable, too.
    MCBinning::MCStatus FindCutPoints(const std::vector<double>* values, const std::vector<double>* table, int first,
                                      int last, std::set<double>& cutPoints) const;

private:
    /// What a call of Run is to treat.
    struct Entry
    {
        int fAttribute;
        int fTarget;
        MCBinning::MCStatus fVerdict; ///< OK, or why the pair can't be binned
    };

    /// What is stored of one pair.
    struct PairResult
    {
        MCBinning::MCStatus fStatus;
        std::set<double> fCutPoints;
        std::vector<double> fCells;
        unsigned int fNumDistinct = 0;
        double fTotalWeight = 0.0;
        double fTotalWeightWithMissing = 0.0;
        double fMinimum = 0.0;
        double fMaximum = 0.0;
        double fModelEntropy = 0.0;
    };

    std::vector<Entry> ListAll() const;
    std::vector<Entry> CheckAttributeTargetPairs(const std::vector<int>* attributes,
                                                 const std::vector<int>* targets) const;
    MCBinning::MCStatus CheckPair(int attribute, int target) const;
    MCBinning::MCStatus CheckAttribute(int attribute) const;
    bool IsListTargetUsable() const;
    MCBinning::MCStatus BinAllEntries(const std::vector<Entry>& entries, int numberOfBins);
    MCBinning::MCStatus BinAttributeTargetPair(int attribute, int target, const BINEFPreProcess& preProcess);
    PairResult BinPair(int attribute, int target, const BINEFPreProcess& preProcess);
    void BinTuples(const std::vector<BINSortTuple>* tuples, const BINEFPreProcess& preProcess, PairResult& result);
    void Store(const PairResult& result, int attribute, int target);

    MCBinning::MCStatus BinRows(const std::vector<double>& values, const std::vector<double>& table,
                                std::set<double>& cutPoints, std::vector<double>& cells, double& modelEntropy);

    std::size_t NumCategories() const { return fNumTargetCategories; }

    unsigned int fNumTargetCategories = 1; ///< K of the current pair
    int fTargetIndex;                      ///< the list's target, -1 without one
};

#endif
