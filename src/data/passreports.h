#ifndef MCOBNQRT_PASSREPORTS_H
#define MCOBNQRT_PASSREPORTS_H

#include "platform/platform.h"

#include <mcobnqrt/binprogressreporter.h>
#include <mcobnqrt/progresslistener.h>

#include <algorithm>
#include <cstdint>
#include <limits>

/// The reports of the data pass: one for every `interval` turns of its loop, none for an interval of 0 or without a
/// listener.
class PassReports
{
public:
    PassReports(ProgressListener* listener, int interval, Platform* platform)
        : fListener(listener), fInterval(interval), fCountdown(interval), fPlatform(platform),
          fStart(platform->GetTickCount())
    {
    }

    /// A number of records beyond an int is reported as the largest one.
    void CountTurn(std::uint64_t numReceived)
    {
        if (fListener == nullptr || --fCountdown != 0)
            return;
        const std::uint64_t largest = std::numeric_limits<int>::max();
        fReporter.SetValues(static_cast<unsigned int>(std::min(numReceived, largest)),
                            fPlatform->GetSecondsSince(fStart));
        fListener->ReportProgress(fReporter);
        fCountdown = fInterval;
    }

private:
    ProgressListener* fListener;
    int fInterval;
    std::int64_t fCountdown; ///< falls below 0, and ever on, with an interval of 0
    Platform* fPlatform;
    std::int64_t fStart;
    BINProgressReporter fReporter;
};

#endif
