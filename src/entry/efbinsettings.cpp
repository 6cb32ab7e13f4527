#include <mcobnqrt/efbinsettings.h>

#include "entry/settingsrules.h"
#include "platform/platform.h"

EFBINSettings::EFBINSettings()
    : fNSkippedCasesReports(kDefaultNSkippedCasesReports), fTempDirName(SystemTempDirectory())
{
}

bool EFBINSettings::operator==(const EFBINSettings& other) const
{
    return EqualInCommon(*this, other);
}

bool EFBINSettings::SetNSkippedAttReports(int value)
{
    return SetUnlessBelow(0, value, fNSkippedAttReports);
}

bool EFBINSettings::SetNSkippedCasesReports(int value)
{
    return SetUnlessBelow(0, value, fNSkippedCasesReports);
}

bool EFBINSettings::SetNumberOfBins(int value)
{
    return SetUnlessBelow(kMinNumberOfBins, value, fNumberOfBins);
}

void EFBINSettings::Display(std::ostream& os) const
{
    DisplayFirstLines(os, "EFBINSettings", *this);
    os << fRightBorderClosed << std::endl;
    DisplayLastLines(os, "EFBINSettings", *this);
}
