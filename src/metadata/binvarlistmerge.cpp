// The comparison of two lists, from one pair of variables up to the whole.

#include <mcobnqrt/binvarlist.h>

#include <mcobnqrt/ibinencoder.h>
#include <mcobnqrt/ibinusermissing.h>

#include <algorithm>
#include <cstddef>

namespace
{

bool HaveEqualDescriptions(const IBINVariable& a, const IBINVariable& b)
{
    return a.GetVariableName() == b.GetVariableName() && a.GetVariableLabel() == b.GetVariableLabel() &&
           a.GetVariableRole() == b.GetVariableRole() && a.GetMeasureLevel() == b.GetMeasureLevel();
}

bool HaveEqualUserMissing(const IBINVariable& a, const IBINVariable& b)
{
    const IBINUserMissing* ofA = a.GetUserMissingInfo();
    const IBINUserMissing* ofB = b.GetUserMissingInfo();
    return ofA ? ofA->IsEqualTo(ofB) : !ofB;
}

/// Whether the variable, which is not continuous and so has an encoder, knows as many categories as that has seen.
bool IsUpToDate(const IBINVariable& variable)
{
    return variable.GetNumberOfCategories() == variable.GetEncoder()->GetNumberOfCategories();
}

bool CanMerge(const IBINVariable& a, const IBINVariable& b)
{
    if (!HaveEqualDescriptions(a, b))
        return false;
    const IBINVariable::VariableRole role = a.GetVariableRole();
    if (role != IBINVariable::RoleAttribute && role != IBINVariable::RoleTarget)
        return true;
    if (!HaveEqualUserMissing(a, b))
        return false;
    return a.GetMeasureLevel() == IBINVariable::MeasureContinuous || (IsUpToDate(a) && IsUpToDate(b));
}

} // namespace

bool BINVarList::CanMergeWith(const BINVarList& other, int& badIndex) const
{
    if (fVars.size() != other.fVars.size())
    {
        badIndex = static_cast<int>(std::min(fVars.size(), other.fVars.size()));
        return false;
    }
    if (fTargetIndex != other.fTargetIndex)
    {
        badIndex = std::min(fTargetIndex, other.fTargetIndex);
        return false;
    }
    for (std::size_t i = 0; i < fVars.size(); ++i)
    {
        if (!CanMerge(*fVars[i], *other.fVars[i]))
        {
            badIndex = static_cast<int>(i);
            return false;
        }
    }
    return true;
}
