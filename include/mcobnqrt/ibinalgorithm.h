#ifndef MCOBNQRT_IBINALGORITHM_H
#define MCOBNQRT_IBINALGORITHM_H

#include <mcobnqrt/export.h>
#include <mcobnqrt/mcstatus.h>

#include <iosfwd>
#include <string>
#include <vector>

class BINOutput;
class BINSettings;
class IBINRecordSource;
class MCQueryCancel;
class ProgressListener;

/// Supervised binning of one data set: finds, for pairs of an attribute and a categorical target, the cut points that
/// best separate the target's categories. BINFactory makes it; the host deletes it, and with it go its temporary files.
///
/// An object reads its records once and works from what it has spooled, so it can be run again with other lists. It
/// works on its own copies of the settings and of the variable list. Everything runs on the thread that calls Run.
class MCOBNQRT_EXPORT IBINAlgorithm
{
public:
    IBINAlgorithm() = default;
    IBINAlgorithm(const IBINAlgorithm&) = default;
    IBINAlgorithm& operator=(const IBINAlgorithm&) = default;

    /// Removes the temporary files, if this is the process that made them: a child process that fork() made may delete
    /// its copy of the object, and the files stay the parent's. No other operation is for the child, as both would read
    /// through the same open files. What GetOutput() and GetSettings() gave dangles afterwards.
    virtual ~IBINAlgorithm() = default;

    /// The name of the component and the version of the library, for the host's reports.
    virtual std::string GetVersionString() = 0;

    /// Bins attributes and adds what is found to GetOutput(); results of earlier calls stay.
    ///
    /// The first call that finds a record reads `source` to its end and spools it. Later calls work from the spooled
    /// data and don't touch `source`, which may be null then. Both lists hold variable indices and are only read during
    /// the call:
    ///
    ///     attributes   targets   what is binned
    ///     null         null      every variable but target and weight, against the list's target
    ///     given        null      the listed ones, against the list's target
    ///     given        given     the pairs (attributes[i], targets[i]); the lists are of one length
    ///
    /// An entry of the lists that can't be binned (a bad index, a target that is not categorical, a variable in two
    /// roles) doesn't stop the others: its reason is the status of its result. The data handling settings (temporary
    /// directory, closed side, distinct value threshold, reports of the pass) are those of the call that reads the
    /// source.
    ///
    /// The listener and the cancel query are called from here. An exception of theirs, of the source, or of an
    /// allocation passes through; if it ended the reading of the source, the object has no data and later calls say so.
    ///
    /// They and the source may call operations of this object, Run too, but they must not delete it. Such an inner call
    /// works as any other and adds its results in between. While the records are being read there are no data yet, and
    /// it gives BINStatusNoRecords. The outer call goes on with the number of bins and with what its lists held when
    /// it began. A cancel query that calls Run is asked by that call, too.
    ///
    /// \return OK; the warning BINStatusSomeResultsFlagged if a pair that this or an earlier call has binned, or tried
    ///         to, carries a status of its own, to be read in its result; BINStatusCancelled, with the results found so
    ///         far kept; or the error that stopped the call before a result was made: BINStatusBadNumberOfBins,
    ///         BINStatusNoValidPairs, BINStatusNoRecords (no record, none of positive weight, none ahead of a cancel,
    ///         or no source), BINStatusTargetUnusable, BINStatusTooManyCategories, BINStatusTempDirNotFound,
    ///         BINStatusCannotOpenTempFile, BINStatusOutOfMemory. An entry that is refused for its indices or roles
    ///         raises no warning here. A call after a failed reading of the source gives that failure again.
    virtual MCBinning::MCStatus Run(IBINRecordSource* source, const std::vector<int>* attributes,
                                    const std::vector<int>* targets) = 0;

    /// Replaces the cancel query, which may be null and stays the host's. A cancel already seen stays seen.
    virtual void SetCancelPointer(MCQueryCancel* query) = 0;

    /// Asks for the end of the run, for good: the object answers BINStatusCancelled from then on.
    virtual void Cancel() = 0;

    /// Replaces the listener in GetSettings(); it may be null and stays the host's. Reports of an attribute loop under
    /// way still go to the former one.
    virtual void SetProgressListener(ProgressListener* listener) = 0;

    /// The results of all runs of this object. Never null; owned by the algorithm.
    virtual BINOutput* GetOutput() = 0;

    /// The last status of a pair that was not OK, or BINStatusCancelled; OK if there is neither. Asks the cancel query.
    virtual MCBinning::MCStatus GetStatus() = 0;

    /// The algorithm's own settings: what is changed through it holds for later runs. Never null; owned by the
    /// algorithm.
    virtual BINSettings* GetSettings() = 0;

    /// Dumps the object's state for a programmer's eye.
    virtual void Display(std::ostream& os) = 0;
};

#endif
