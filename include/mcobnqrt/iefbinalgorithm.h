#ifndef MCOBNQRT_IEFBINALGORITHM_H
#define MCOBNQRT_IEFBINALGORITHM_H

#include <mcobnqrt/export.h>
#include <mcobnqrt/mcstatus.h>

#include <iosfwd>
#include <string>
#include <vector>

class EFBINOutput;
class EFBINSettings;
class IBINRecordSource;
class MCQueryCancel;
class ProgressListener;

/// Equal-frequency binning of one data set: cuts each attribute at weighted percentiles, without a target. EFBINFactory
/// makes it; the host deletes it, and with it go its temporary files.
///
/// An object reads its records once and works from what it has spooled, so it can be run again with another list. It
/// works on its own copies of the settings and of the variable list. A target of the list is a variable like any other
/// here. Everything runs on the thread that calls Run.
class MCOBNQRT_EXPORT IEFBINAlgorithm
{
public:
    IEFBINAlgorithm() = default;
    IEFBINAlgorithm(const IEFBINAlgorithm&) = default;
    IEFBINAlgorithm& operator=(const IEFBINAlgorithm&) = default;

    /// Removes the temporary files, if this is the process that made them: a child process that fork() made may delete
    /// its copy of the object, and the files stay the parent's. No other operation is for the child, as both would read
    /// through the same open files. What GetOutput() and GetSettings() gave dangles afterwards.
    virtual ~IEFBINAlgorithm() = default;

    /// The name of the component and the version of the library, for the host's reports.
    virtual std::string GetVersionString() = 0;

    /// Bins attributes and adds what is found to GetOutput(); results of earlier calls stay.
    ///
    /// The first call that finds a record reads `source` to its end and spools it. Later calls work from the spooled
    /// data and don't touch `source`, which may be null then. `attributes` holds variable indices and is only read
    /// during the call; null stands for every variable but the weight. An entry that can't be binned doesn't stop the
    /// others: its reason is the status of its result, but for a negative index, which leaves no result. The data
    /// handling settings (temporary directory, closed side, reports of the pass) are those of the call that reads the
    /// source.
    ///
    /// The listener and the cancel query are called from here. An exception of theirs, of the source, or of an
    /// allocation passes through; if it ended the reading of the source, the object has no data and later calls say so.
    ///
    /// They and the source may call operations of this object, Run too, but they must not delete it. Such an inner call
    /// works as any other and adds its results in between. While the records are being read there are no data yet, and
    /// it gives BINStatusNoRecords. The outer call goes on with the number of bins and with what its list held when
    /// it began. A cancel query that calls Run is asked by that call, too.
    ///
    /// \return OK; the warning BINStatusSomeResultsFlagged if an attribute that this or an earlier call has binned, or
    ///         tried to, carries a status of its own, to be read in its result; BINStatusCancelled, with the results
    ///         found so far kept; or the error that stopped the call before a result was made:
    ///         BINStatusBadNumberOfBins, BINStatusBadAttributeIndex (no entry can be binned), BINStatusNoRecords (no
    ///         record, none of positive weight, none ahead of a cancel, or no source), BINStatusTooManyCategories,
    ///         BINStatusTempDirNotFound, BINStatusCannotOpenTempFile, BINStatusOutOfMemory. An entry that is refused
    ///         for its index or role raises no warning here. A call after a failed reading of the source gives that
    ///         failure again.
    virtual MCBinning::MCStatus Run(IBINRecordSource* source, const std::vector<int>* attributes) = 0;

    /// Replaces the cancel query, which may be null and stays the host's. A cancel already seen stays seen.
    virtual void SetCancelPointer(MCQueryCancel* query) = 0;

    /// Asks for the end of the run, for good: the object answers BINStatusCancelled from then on.
    virtual void Cancel() = 0;

    /// Replaces the listener in GetSettings(); it may be null and stays the host's. Reports of an attribute loop under
    /// way still go to the former one.
    virtual void SetProgressListener(ProgressListener* listener) = 0;

    /// The results of all runs of this object. Never null; owned by the algorithm.
    virtual EFBINOutput* GetOutput() = 0;

    /// The last status of an attribute that was not OK, or BINStatusCancelled; OK if there is neither. Asks the cancel
    /// query.
    virtual MCBinning::MCStatus GetStatus() = 0;

    /// The algorithm's own settings: what is changed through it holds for later runs. Never null; owned by the
    /// algorithm.
    virtual EFBINSettings* GetSettings() = 0;

    /// Dumps the object's state for a programmer's eye.
    virtual void Display(std::ostream& os) = 0;
};

#endif
