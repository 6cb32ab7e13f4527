#ifndef MCOBNQRT_METADATAPRINTERS_H
#define MCOBNQRT_METADATAPRINTERS_H

#include <mcobnqrt/ibinvariable.h>

#include <iosfwd>

/// Each writes the words for a number and ends the line. Of a level or role without a name the number is written, of
/// such a rounding option nothing.
void DisplayMeasureLevel(std::ostream& os, IBINVariable::MeasureLevel level);
void DisplayVariableRole(std::ostream& os, IBINVariable::VariableRole role);
void DisplayRoundingOption(std::ostream& os, IBINVariable::BINWRoundingOption option);

#endif
