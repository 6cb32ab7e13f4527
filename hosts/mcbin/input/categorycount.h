#ifndef MCBIN_CATEGORYCOUNT_H
#define MCBIN_CATEGORYCOUNT_H

class Progress;
class TableReader;
struct ColumnPlan;

/// Gives the columns of the plan whose categories have no order of their own the one that follows from the weights of
/// the target's categories: of the target of all attributes, or of that of the first pair with the attribute. A column
/// that is a target itself, or whose order was declared, keeps what it has. Rare categories of the
/// columns that are ordered get a code together.
///
/// For this the table is read once more if there is such a column. The weights can't be counted while the plan is
/// completed, as their grid depends on all of them.
///
/// \throw NotOnlyNumbers as the record source does.
void OrderCategories(TableReader& table, ColumnPlan& plan, Progress& progress);

#endif
