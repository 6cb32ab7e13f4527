#ifndef MCOBNQRT_BINCANCELMONITOR_H
#define MCOBNQRT_BINCANCELMONITOR_H

class MCQueryCancel;

/// Answers whether the work on an algorithm is to stop: the host's query, and the flag that it raises. There is one for
/// each algorithm, which owns it; the data preparator works with a pointer to it, so a cancel is seen in both.
///
/// Once the flag is up it stays up, and the query is not called any more.
class BINCancelMonitor
{
public:
    /// `query` may be null; it stays the host's and outlives this object.
    explicit BINCancelMonitor(MCQueryCancel* query) : fQuery(query) {}
    BINCancelMonitor(const BINCancelMonitor&) = delete;
    BINCancelMonitor& operator=(const BINCancelMonitor&) = delete;

    /// Replaces the query; the flag stays as it is.
    void SetCancelPointer(MCQueryCancel* query) { fQuery = query; }

    void Cancel() { fCancelled = true; }

    /// Asks the query, if the flag isn't up already. What the query throws passes through.
    bool IsCancelled();

private:
    MCQueryCancel* fQuery;
    bool fCancelled = false;
};

#endif
