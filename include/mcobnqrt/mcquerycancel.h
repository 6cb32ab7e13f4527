#ifndef MCOBNQRT_MCQUERYCANCEL_H
#define MCOBNQRT_MCQUERYCANCEL_H

#include <mcobnqrt/export.h>

/// Implemented by a host that lets its user stop a run. Hand it in through the settings or IBINAlgorithm's
/// SetCancelPointer; it stays the host's and must outlive the algorithm.
class MCOBNQRT_EXPORT MCQueryCancel
{
public:
    virtual ~MCQueryCancel() = default;

    /// Answers true to stop the work, for good: a cancelled algorithm stays cancelled, and the query is not asked
    /// again.
    ///
    /// It is asked from inside Run, on the thread of that call: before the records are read, ahead of each record and
    /// after the last, when the name of a temporary file is taken, around each attribute or pair, and at the end. So it
    /// has to be cheap. GetStatus of the algorithm, and so its creation too, asks it as well. One attribute is not
    /// interrupted: a cancel takes effect when it is done, and its result is kept. What the query throws passes to the
    /// caller.
    virtual bool QueryCancel() = 0;
};

#endif
