#ifndef MCOBNQRT_ATTRIBUTEREPORTS_H
#define MCOBNQRT_ATTRIBUTEREPORTS_H

#include "platform/platform.h"

#include <mcobnqrt/binprogressreporter.h>
#include <mcobnqrt/mcstatus.h>
#include <mcobnqrt/progresslistener.h>

#include <cstdint>

/// The reports of one loop over attributes: after each treated attribute, or with settings that skip n, after each
/// (n+1)th. An attribute that ended in an error makes no report but counts, and the next that didn't then reports.
template<class Settings>
class AttributeReports
{
public:
    /// Takes the listener from the settings; may be null, and then nothing is counted. The settings are asked again for
    /// the number to skip after each report.
    AttributeReports(const Settings& settings, Platform* platform)
        : fSettings(settings), fListener(settings.GetProgressListener()), fCountdown(settings.GetNSkippedAttReports()),
          fPlatform(platform), fStart(platform->GetTickCount())
    {
    }

    void CountAttribute(int attribute, const MCBinning::MCStatus& status)
    {
        if (fListener == nullptr)
            return;
        const bool isDue = fCountdown <= 0;
        --fCountdown;
        if (!isDue || status.IsError())
            return;
        fReporter.SetValues(static_cast<unsigned int>(attribute), fPlatform->GetSecondsSince(fStart));
        fListener->ReportProgress(fReporter);
        fCountdown = fSettings.GetNSkippedAttReports();
    }

private:
    const Settings& fSettings;
    ProgressListener* fListener;
    std::int64_t fCountdown;
    Platform* fPlatform;
    std::int64_t fStart;
    BINProgressReporter fReporter;
};

#endif
