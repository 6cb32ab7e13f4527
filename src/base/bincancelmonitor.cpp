#include "base/bincancelmonitor.h"

#include <mcobnqrt/mcquerycancel.h>

bool BINCancelMonitor::IsCancelled()
{
    // The answer only ever raises the flag: a host may call Cancel from within its query, and then answer no.
    if (!fCancelled && fQuery != nullptr && fQuery->QueryCancel())
        fCancelled = true;
    return fCancelled;
}
