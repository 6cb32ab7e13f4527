#include "metadata/recordlayout.h"

#include <mcobnqrt/binvarlist.h>

#include <ostream>

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

template<class Numbers>
void DisplayNumbers(std::ostream& out, const char* label, const Numbers& numbers)
{
    out << label;
    for (const auto number : numbers) out << static_cast<int>(number) << ' ';
    out << std::endl;
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

RecordLayout::RecordLayout(const BINVarList& list)
    : fNumAttributes(list.GetNumAttributeVars()), fHasTarget(list.GetTargetIndex() >= 0 ? 1 : 0),
      fHasWeight(list.GetWeightIndex() >= 0 ? 1 : 0)
{
    const int size = static_cast<int>(list.Size());
    for (int variable = 0; variable < size; ++variable)
    {
        fMeasureLevels.push_back(list.GetVarAt(variable)->GetMeasureLevel());
        fRoles.push_back(list.GetVariableRole(variable));
        fPositions.push_back(PlaceVariable(variable));
    }
}

/// Notes what the variable's role makes of it. \return its position, -1 if it has none.
int RecordLayout::PlaceVariable(int variable)
{
    switch (fRoles.back())
    {
    case IBINVariable::RoleAttribute:
        fAttributes.push_back(variable);
        return GetFirstAttributePosition() + static_cast<int>(fAttributes.size()) - 1;
    case IBINVariable::RoleTarget:
        fTargetVariable = variable;
        return 0;
    case IBINVariable::RoleFrequencyWeight:
        fWeightVariable = variable;
        return GetWeightPosition();
    default:
        return -1;
    }
}

int RecordLayout::PositionOf(int variable) const
{
    return variable >= 0 && variable < GetNumVariables() ? fPositions[static_cast<std::size_t>(variable)] : -1;
}

void RecordLayout::Display(std::ostream& out) const
{
    out << "\tOriginal record size = " << GetNumVariables() << std::endl;
    out << "\tProcessed record size = " << GetNumPositions() << std::endl;
    out << "\tInput-only record size = " << fNumAttributes << std::endl;
    // The second number only says whether there is a weight; its position is in the next line.
    out << "\tFrequency weight original and new indices: " << fWeightVariable << "   " << (fWeightVariable < 0 ? -1 : 1)
        << std::endl;
    DisplayNumbers(out, "\tVariable index: ", fPositions);
    DisplayNumbers(out, "\tIndices of input variables in the variable list: ", fAttributes);
    DisplayNumbers(out, "\tVariable measurement levels: ", fMeasureLevels);
    DisplayNumbers(out, "\tVariable roles: ", fRoles);
}
