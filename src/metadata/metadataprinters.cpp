#include "metadata/metadataprinters.h"

#include <ostream>

namespace
{

/// The words for a level, null if it has no name.
const char* NameOf(IBINVariable::MeasureLevel level)
{
    switch (level)
    {
    case IBINVariable::MeasureUnknown:
        return "Unknown measure level";
    case IBINVariable::MeasureContinuous:
        return "Continuous";
    case IBINVariable::MeasureNumericCategorical:
        return "Numeric Categorical";
    case IBINVariable::MeasureStringCategorical:
        return "String Categorical";
    case IBINVariable::MeasureFrequencyWeight:
        return "Frequency weight";
    }
    return nullptr;
}

/// The words for a role, null if it has no name.
const char* NameOf(IBINVariable::VariableRole role)
{
    switch (role)
    {
    case IBINVariable::RoleUndefined:
        return "Undefined variable role";
    case IBINVariable::RoleAttribute:
        return "Attribute";
    case IBINVariable::RoleTarget:
        return "Target";
    case IBINVariable::RoleFrequencyWeight:
        return "Frequency weight";
    }
    return nullptr;
}

template<class Number>
void DisplayName(std::ostream& os, Number number, const char* heading)
{
    if (const char* name = NameOf(number))
        os << name << std::endl;
    else
        os << heading << static_cast<int>(number) << std::endl;
}

} // namespace

void DisplayMeasureLevel(std::ostream& os, IBINVariable::MeasureLevel level)
{
    DisplayName(os, level, "Measure level ");
}

void DisplayVariableRole(std::ostream& os, IBINVariable::VariableRole role)
{
    DisplayName(os, role, "Variable role ");
}

void DisplayRoundingOption(std::ostream& os, IBINVariable::BINWRoundingOption option)
{
    if (option == IBINVariable::RoundTruncate)
        os << "Truncate to smaller int";
    else if (option == IBINVariable::RoundClosest)
        os << "Round to closest int";
    os << std::endl;
}
