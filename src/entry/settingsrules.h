#ifndef MCOBNQRT_SETTINGSRULES_H
#define MCOBNQRT_SETTINGSRULES_H

#include <ostream>

// Rules that BINSettings and EFBINSettings share.

/// By default the data pass reports after every hundred thousand records.
constexpr int kDefaultNSkippedCasesReports = 100000;

/// A single bin would be no binning.
constexpr int kMinNumberOfBins = 2;

/// Stores `value` in `setting`, or refuses it with false if it is below `lowest`.
inline bool SetUnlessBelow(int lowest, int value, int& setting)
{
    if (value < lowest)
        return false;
    setting = value;
    return true;
}

/// Whether two settings objects are equal in all that takes part in their comparison and that both classes have.
template<class Settings>
bool EqualInCommon(const Settings& left, const Settings& right)
{
    return left.GetNSkippedAttReports() == right.GetNSkippedAttReports() &&
           left.GetNSkippedCasesReports() == right.GetNSkippedCasesReports() &&
           left.IsRightBorderClosed() == right.IsRightBorderClosed() &&
           left.GetNumberOfBins() == right.GetNumberOfBins();
}

/// Writes the lines of a display in front of those that the classes word differently.
template<class Settings>
void DisplayFirstLines(std::ostream& os, const char* className, const Settings& settings)
{
    os << std::endl;
    os << "Start of " << className << " display" << std::endl;
    os << "Number of progress reports to skip when create bins for attribute = " << settings.GetNSkippedAttReports()
       << std::endl;
    os << "Number of progress reports to skip when read data file = " << settings.GetNSkippedCasesReports()
       << std::endl;
}

/// Writes the lines of a display behind those that the classes word differently.
template<class Settings>
void DisplayLastLines(std::ostream& os, const char* className, const Settings& settings)
{
    os << "Number of bins for EF = " << settings.GetNumberOfBins() << std::endl;
    os << "End of " << className << " display" << std::endl;
}

#endif
