#include <mcobnqrt/mcstatus.h>

namespace MCBinning
{

MCStatus::MCStatus(long code, bool isWarning)
    : fErrorCode(static_cast<std::int32_t>(code)), fSeverity(isWarning ? 1 : -1)
{
}

bool MCStatus::operator==(const MCStatus& other) const
{
    return fErrorCode == other.fErrorCode && fSeverity == other.fSeverity && fDiscreteData == other.fDiscreteData &&
           fScaleData == other.fScaleData;
}

long MCStatus::GetDiscreteDatum(unsigned int index) const
{
    return index < fDiscreteData.size() ? fDiscreteData[index] : 0;
}

double MCStatus::GetScaleDatum(unsigned int index) const
{
    return index < fScaleData.size() ? fScaleData[index] : 0.0;
}

void MCStatus::SetDiscreteDatum(unsigned int index, long value)
{
    if (index < fDiscreteData.size())
        fDiscreteData[index] = static_cast<std::int32_t>(value);
}

void MCStatus::SetScaleDatum(unsigned int index, double value)
{
    if (index < fScaleData.size())
        fScaleData[index] = value;
}

} // namespace MCBinning
