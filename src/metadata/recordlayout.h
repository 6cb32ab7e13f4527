#ifndef MCOBNQRT_RECORDLAYOUT_H
#define MCOBNQRT_RECORDLAYOUT_H

#include <mcobnqrt/ibinvariable.h>

#include <iosfwd>
#include <vector>

class BINVarList;

/// The index of the first variable that has no position of its own in a processed record, -1 if every one has.
///
/// A record has one position for the list's target, one for its weight, and one for each attribute. A variable has
/// none if its role is undefined, or that of a target or a weight without its being the list's; nor has one that the
/// target index names although its role is another. No data can be prepared for a list with such a variable, nor for
/// one whose target index names no variable at all; that index is returned then.
int FindVariableWithoutPosition(const BINVarList& list);

/// Tells where the variables of a list stand in a processed record: target, weight, attributes in list order, target
/// and weight only where the list has one. A field's index in that record is its position; its index in the host's
/// record is the variable's index in the list.
///
/// The layout is that of the list at the time of construction.
class RecordLayout
{
public:
    explicit RecordLayout(const BINVarList& list);

    int GetNumVariables() const { return static_cast<int>(fRoles.size()); }
    int GetNumPositions() const { return GetFirstAttributePosition() + fNumAttributes; }

    int GetTargetVariable() const { return fTargetVariable; }             ///< -1 without one; its position is 0
    int GetWeightVariable() const { return fWeightVariable; }             ///< -1 without one
    const std::vector<int>& GetAttributes() const { return fAttributes; } ///< variable indices, by position

    int GetWeightPosition() const { return fHasTarget; }
    int GetFirstAttributePosition() const { return fHasTarget + fHasWeight; }

    /// By variable index; -1 for a variable without a position.
    const std::vector<int>& GetPositions() const { return fPositions; }

    /// As GetPositions(), and -1 for an index that doesn't exist.
    int PositionOf(int variable) const;

    IBINVariable::MeasureLevel GetMeasureLevel(int variable) const
    {
        return fMeasureLevels[static_cast<std::size_t>(variable)];
    }

    /// Writes the layout, line by line, for the programmer's eye.
    void Display(std::ostream& out) const;

private:
    int PlaceVariable(int variable);

    int fNumAttributes;
    int fHasTarget; ///< 1 if the list has a target, else 0
    int fHasWeight; ///< 1 if the list has a weight, else 0
    int fTargetVariable = -1;
    int fWeightVariable = -1;
    std::vector<int> fPositions;                            ///< by variable index
    std::vector<int> fAttributes;                           ///< variable index of each attribute
    std::vector<IBINVariable::MeasureLevel> fMeasureLevels; ///< by variable index
    std::vector<IBINVariable::VariableRole> fRoles;         ///< by variable index
};

#endif
