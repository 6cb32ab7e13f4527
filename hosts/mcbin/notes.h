#ifndef MCBIN_NOTES_H
#define MCBIN_NOTES_H

#include <string>
#include <vector>

class TableRecordSource;
struct Bins;
struct ColumnPlan;
struct Variables;

/// What a user should know of the results beside them: columns that look like numbers and aren't taken for such, whole
/// numbers that have become one, and what the weights do to the criterion. `source` has been read to its end.
std::vector<std::string> MakeNotes(const Bins& bins, const ColumnPlan& plan, const Variables& variables,
                                   const TableRecordSource& source);

#endif
