#ifndef MCOBNQRT_RECORDLAYOUT_H
#define MCOBNQRT_RECORDLAYOUT_H

class BINVarList;

/// The index of the first variable that has no position of its own in a processed record, -1 if every one has.
///
/// A record has one position for the list's target, one for its weight, and one for each attribute. A variable has
/// none if its role is undefined, or that of a target or a weight without its being the list's; nor has one that the
/// target index names although its role is another. No data can be prepared for a list with such a variable, nor for
/// one whose target index names no variable at all, which is then what is given.
int FindVariableWithoutPosition(const BINVarList& list);

#endif
