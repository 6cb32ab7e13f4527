#ifndef MCOBNQRT_PROGRESSLISTENER_H
#define MCOBNQRT_PROGRESSLISTENER_H

#include <mcobnqrt/export.h>

class ProgressReport;

/// Implemented by a host that shows how far a run is. Hand it in through the settings or IBINAlgorithm's
/// SetProgressListener; it stays the host's and must outlive the algorithm.
///
/// It is called from inside Run, on the thread of that call, in two phases:
///
///     phase                     a report                           "IndexVar"
///     reading the records       after every nth turn, n being      the number of records read so far
///                               GetNSkippedCasesReports(); with
///                               n = 0 never
///     binning the attributes    after every (n+1)th attribute,     the variable index of the attribute
///                               n being GetNSkippedAttReports()
///
/// A turn of reading is a call of IBINRecordSource::Next(), with a record or without one. "elapsedTime" is in both the
/// seconds since the phase began. An attribute or pair whose result is an error makes no report of its own: a report
/// that is due then comes with the next one that has no error.
class MCOBNQRT_EXPORT ProgressListener
{
public:
    virtual ~ProgressListener() = default;

    /// Reads what it wants of `report`, which doesn't outlive the call. What it throws passes to the caller of Run.
    virtual void ReportProgress(ProgressReport& report) = 0;
};

#endif
