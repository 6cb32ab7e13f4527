#include <mcobnqrt/binsettings.h>

#include "entry/settingsrules.h"
#include "platform/platform.h"

BINSettings::BINSettings() : fNSkippedCasesReports(kDefaultNSkippedCasesReports), fTempDirName(SystemTempDirectory()) {}

bool BINSettings::operator==(const BINSettings& other) const
{
    return EqualInCommon(*this, other) && fNumDistinctValueThreshold == other.fNumDistinctValueThreshold;
}

bool BINSettings::SetNSkippedAttReports(int value)
{
    return SetUnlessBelow(0, value, fNSkippedAttReports);
}

bool BINSettings::SetNSkippedCasesReports(int value)
{
    return SetUnlessBelow(0, value, fNSkippedCasesReports);
}

bool BINSettings::SetNumDistinctValueThreshold(int value)
{
    return SetUnlessBelow(0, value, fNumDistinctValueThreshold);
}

bool BINSettings::SetNumberOfBins(int value)
{
    return SetUnlessBelow(kMinNumberOfBins, value, fNumberOfBins);
}

bool BINSettings::SetSmallBinDetectionThreshold(double value)
{
    // The condition is negated so that it refuses a NaN.
    if (!(value >= 0.0 && value <= 1.0))
        return false;
    fSmallBinDetectionThreshold = value;
    return true;
}

void BINSettings::Display(std::ostream& os) const
{
    DisplayFirstLines(os, "BINSettings", *this);
    // The label is a misnomer for the closed border, but the text is promised.
    os << "if use EF as proprecess = " << fRightBorderClosed << std::endl;
    os << "Number of distinct value = " << fNumDistinctValueThreshold << std::endl;
    DisplayLastLines(os, "BINSettings", *this);
}
