#ifndef MCBIN_COLUMNFAULTS_H
#define MCBIN_COLUMNFAULTS_H

#include <cstddef>

class TableReader;
struct ColumnPlan;

/// A run takes the codes from 0 to 255.
constexpr std::size_t kMostCategories = 256;

/// Throws a Failure if there are columns that the run can't take as the plan has them, once the whole table has been
/// read: columns with texts among numbers, columns of text that were asked for by name, and columns with too many
/// categories. The message names all of them, as identifiers seldom come alone, and says what can be done.
void ThrowIfFaulty(const TableReader& table, const ColumnPlan& plan);

#endif
