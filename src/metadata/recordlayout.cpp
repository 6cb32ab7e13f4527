#include "metadata/recordlayout.h"

#include <mcobnqrt/binvarlist.h>

namespace
{

bool HasPosition(const BINVarList& list, int index)
{
    const bool isTarget = index == list.GetTargetIndex();
    switch (list.GetVariableRole(index))
    {
    case IBINVariable::RoleAttribute:
        return !isTarget;
    case IBINVariable::RoleTarget:
        return isTarget;
    case IBINVariable::RoleFrequencyWeight:
        return !isTarget && index == list.GetWeightIndex();
    default:
        return false;
    }
}

} // namespace

int FindVariableWithoutPosition(const BINVarList& list)
{
    const int size = static_cast<int>(list.Size());
    for (int i = 0; i < size; ++i)
    {
        if (!HasPosition(list, i))
            return i;
    }
    return list.GetTargetIndex() < size ? -1 : list.GetTargetIndex();
}
