#ifndef MCOBNQRT_EFBINFACTORY_H
#define MCOBNQRT_EFBINFACTORY_H

#include <mcobnqrt/export.h>
#include <mcobnqrt/iefbinalgorithm.h>
#include <mcobnqrt/mcstatus.h>

#include <memory>

class EFBINSettings;
class BINVarList;

/// Makes algorithms for equal-frequency binning, and is the gate at which a variable list is validated. One factory
/// makes any number of them; it keeps nothing of what it hands out.
class MCOBNQRT_EXPORT EFBINFactory
{
public:
    EFBINFactory();
    /// Takes over the status of `other`.
    EFBINFactory(const EFBINFactory& other);
    /// Takes over the status of `other`.
    EFBINFactory& operator=(const EFBINFactory& other);
    ~EFBINFactory();

    /// Makes an algorithm on copies of `settings` and `varList`; later changes to either don't reach it. The listener
    /// and the cancel query that the settings point to stay the host's and must outlive the algorithm.
    ///
    /// `varList` must hold an attribute, every categorical variable must have two categories or more, and every
    /// variable must be an attribute, the list's one target or its weight. Good settings are not asked for here:
    /// IEFBINAlgorithm::Run tells what is missing. The cancel query is asked once; an exception of its passes through.
    ///
    /// \return the algorithm, which the caller owns, or null, and then GetStatus() tells why: BINStatusInvalidVarList
    ///         (slot 1 of the discrete data is the index of a variable without categories, else of one with a single
    ///         category, else of one without a part in the analysis, else -1: no variable at all, or no attribute),
    ///         BINStatusOutOfMemory or BINStatusCancelled.
    IEFBINAlgorithm* CreateEFBINAlgorithm(EFBINSettings& settings, BINVarList& varList);

    /// How the last create operation ended; OK before the first.
    MCBinning::MCStatus GetStatus() const;

private:
    MCBinning::MCStatus fStatus;
    std::unique_ptr<IEFBINAlgorithm> fAlgorithm; ///< the one under construction; null outside of a create operation
};

#endif
