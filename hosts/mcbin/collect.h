#ifndef MCBIN_COLLECT_H
#define MCBIN_COLLECT_H

#include <mcobnqrt/ibinvariable.h>

class BINAttributeResults;
class BINAttributeTargetResults;
struct ColumnPlan;
struct Findings;
struct Variables;

// These fill the findings with what the table and the library say.

void AddPlan(Findings& findings, const ColumnPlan& plan);

/// `variables` have been made from `plan`. `rounding` is that of the weight, which their list doesn't tell.
void AddVariables(Findings& findings, const ColumnPlan& plan, const Variables& variables,
                  IBINVariable::BINWRoundingOption rounding);

/// Adds a result. The variables must be there, as it is about them. One that names no variable is passed over.
void AddResult(Findings& findings, const BINAttributeTargetResults& result);
void AddResult(Findings& findings, const BINAttributeResults& result);

#endif
