#ifndef MCOBNQRT_BINATTRIBUTEREADER_H
#define MCOBNQRT_BINATTRIBUTEREADER_H

#include "data/binaryrecorditerator.h"
#include "data/binsorttuple.h"
#include "data/binvaluetuple.h"

#include <mcobnqrt/mccommon.h>
#include <mcobnqrt/mcstatus.h>

#include <memory>
#include <string>
#include <vector>

class BINDataPreparator;
class IBINRecordSource;

/// Which tuples a reader makes of the spooled records.
enum class TupleKind
{
    kWithTarget,   ///< for pairs; a list without a target takes any categorical variable as one
    kWithoutTarget ///< for attributes alone; a target of the list is a variable like any other
};

/// Hands the binning the data of one attribute at a time: joins the attribute's temporary file with those of target and
/// weight, leaves out what is missing, sorts the rest by value, and works out the figures of the data.
///
/// There is one vector of tuples, made once for all accepted records and used again for each attribute: only its first
/// GetNumTuples() elements are current. The figures and the tuples hold until the next read.
class BINAttributeReader
{
public:
    /// Does no work. The source is used once, by ReadRecords(); the preparator outlives the reader.
    BINAttributeReader(IBINRecordSource* source, BINDataPreparator* preparator, TupleKind kind);
    BINAttributeReader(const BINAttributeReader&) = delete;
    BINAttributeReader& operator=(const BINAttributeReader&) = delete;
    ~BINAttributeReader();

    /// From now on an attribute with more distinct values than `threshold` is to be pre-binned. 0 changes nothing.
    void SetNumDistinctValueThreshold(unsigned int threshold);

    /// Runs the data pass and gets ready for reads. \return the status of the pass, or BINStatusOutOfMemory for the
    /// tuples.
    MCBinning::MCStatus ReadRecords();

    /// As BINDataPreparator::IsVariableUsable, of a variable index. BINStatusTargetUnusable for a negative one.
    MCBinning::MCStatus IsVariableUsable(int variable, bool* usable) const;

    /// Loads and sorts a pair, given by variable indices, and sets `*tuples` to the reader's vector, or to null.
    ///
    /// \return OK; BINStatusTargetUnusable, and then the figures of the last read stay; BINStatusTooManyCategories for
    ///         an attribute with a code that doesn't fit, its index in slot 0 of the discrete data;
    ///         BINStatusCannotOpenTempFile if a file can't be opened or doesn't hold all records any more.
    MCBinning::MCStatus GetAttributeTargetData(int attribute, int target, std::vector<BINSortTuple>** tuples);

    /// As GetAttributeTargetData, for an attribute without a target.
    MCBinning::MCStatus GetAttributeData(int attribute, std::vector<BINValueTuple>** tuples);

    /// As the function of that name, over the current tuples. Null for `cuts` is the warning BINStatusBadBinTable, too.
    MCBinning::MCStatus TallyBins(const std::vector<double>* cuts, bool rightBorderClosed,
                                  std::vector<double>& table) const;

    unsigned int GetNumTargetCats() const { return fNumTargetCats; } ///< the target's largest code + 1
    unsigned int GetNumTuples() const { return fNumTuples; }
    unsigned int GetNumDistinct() const { return fNumDistinct; }
    double GetTotalWeight() const { return fTotalWeight; }
    double GetTotalWeightWithMissing() const { return fTotalWeightWithMissing; } ///< of all accepted records
    double GetMinValue() const { return fMinValue; }                             ///< gMissingValue without a tuple
    double GetMaxValue() const { return fMaxValue; }                             ///< gMissingValue without a tuple
    bool IsPreBinningEngaged() const { return fUseEFAsPreprocess; }

private:
    using Iterator = MCBinning::BinaryRecordIterator;

    std::unique_ptr<Iterator> OpenPosition(int position) const;
    bool PutOn(int position, std::unique_ptr<Iterator>& iterator, int& iteratorPosition) const;
    MCBinning::MCStatus LoadVariable(int attribute);
    MCBinning::MCStatus LoadAttribute(int position);
    bool HasNextInAll(const Iterator& attribute) const;
    std::size_t CommonBlockSize(const Iterator& attribute) const;
    template<class Tuple>
    bool AddTuples(std::vector<Tuple>& tuples, const double* values, std::size_t count);
    template<class Tuple>
    bool AreSumsExact(const std::vector<Tuple>& tuples) const;
    template<class Tuple>
    void SortAndMeasure(std::vector<Tuple>& tuples);

    unsigned int fNumTargetCats = 0;
    bool fHasWeight = false;
    bool fHasTarget = false; ///< the tuples carry a target
    std::unique_ptr<std::vector<BINSortTuple>> fTargetTuples;
    std::unique_ptr<std::vector<BINValueTuple>> fValueTuples;
    std::unique_ptr<Iterator> fTargetIterator; ///< on the file of fTargetPosition
    std::unique_ptr<Iterator> fWeightIterator;
    IBINRecordSource* fRecordSource; ///< the host's; used once
    BINDataPreparator* fPreparator;  ///< the algorithm's; not owned
    bool fUseThreshold = false;
    std::vector<std::string> fFileNames; ///< by position
    unsigned int fNumTuples = 0;
    unsigned int fNumDistinct = 0;
    unsigned int fNumRecords = 0; ///< accepted by the pass, and the size of the tuple vector
    double fTotalWeight = 0.0;
    double fTotalWeightWithMissing = 0.0;
    unsigned int fNumDistinctValueThreshold = 0;
    bool fUseEFAsPreprocess = false; ///< this attribute is to be pre-binned
    int fTargetPosition = 0;
    int fWeightPosition = -1;
    double fMinValue = MCMV::gMissingValue;
    double fMaxValue = MCMV::gMissingValue;
    TupleKind fTupleKind;
};

#endif
