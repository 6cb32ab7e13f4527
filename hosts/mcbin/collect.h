#ifndef MCBIN_COLLECT_H
#define MCBIN_COLLECT_H

#include <vector>

class BINAttributeResults;
class BINAttributeTargetResults;
class InfiniteValues;
class WeightGrid;
struct ColumnPlan;
struct Findings;
struct Variables;

// These fill the findings with what the table and the library say.

void AddPlan(Findings& findings, const ColumnPlan& plan);

/// `variables` have been made from `plan`.
void AddVariables(Findings& findings, const ColumnPlan& plan, const Variables& variables);

/// Tells the grid of the variable that holds the weights, if there is one.
void AddWeightGrid(Findings& findings, const WeightGrid& grid);

/// Adds a result. The variables must be there, as it is about them, and so must the values that the library was given
/// of each. One that names no variable is passed over.
void AddResult(Findings& findings, const BINAttributeTargetResults& result, const std::vector<InfiniteValues>& values);
void AddResult(Findings& findings, const BINAttributeResults& result, const std::vector<InfiniteValues>& values);

#endif
