#ifndef MCOBNQRT_MAKESTATUS_H
#define MCOBNQRT_MAKESTATUS_H

#include <mcobnqrt/mcstatus.h>

inline MCBinning::MCStatus MakeError(MCBinning::BINStatusCode code)
{
    return MCBinning::MCStatus(code, false);
}

inline MCBinning::MCStatus MakeWarning(MCBinning::BINStatusCode code)
{
    return MCBinning::MCStatus(code, true);
}

/// The status with `index`, of the variable or position that it is about, in slot 0 of its discrete data.
inline MCBinning::MCStatus AboutIndex(MCBinning::MCStatus status, int index)
{
    status.SetDiscreteDatum(0, index);
    return status;
}

#endif
