#ifndef MCOBNQRT_METADATAPRINTERS_H
#define MCOBNQRT_METADATAPRINTERS_H

#include <mcobnqrt/ibinvariable.h>

#include <iosfwd>

/// Each writes the words for a number and ends the line. A level or role without a name is written as its number, a
/// rounding option without a name not at all.
void DisplayMeasureLevel(std::ostream& os, IBINVariable::MeasureLevel level);
void DisplayVariableRole(std::ostream& os, IBINVariable::VariableRole role);
void DisplayRoundingOption(std::ostream& os, IBINVariable::BINWRoundingOption option);

#endif
