#ifndef MCBIN_COLUMNFAULTS_H
#define MCBIN_COLUMNFAULTS_H

class TableReader;
struct ColumnPlan;

/// Throws a Failure if there are columns that the run can't take as the plan has them, once the whole table has been
/// read: columns with texts among numbers, columns of text that were asked for by name, and columns with too many
/// categories. The message names all of them, as identifiers seldom come alone, and says what can be done.
void ThrowIfFaulty(const TableReader& table, const ColumnPlan& plan);

#endif
