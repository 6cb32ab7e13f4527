#ifndef MCBIN_SQLOUTPUT_H
#define MCBIN_SQLOUTPUT_H

#include <iosfwd>

struct Findings;

/// Prints a CASE expression of standard SQL for each attribute with cut points, with commas between them, as they stand
/// behind SELECT. Its value is the number of the bin, from 0, and NULL for a missing value and for a category never
/// seen.
void PrintSql(std::ostream& os, const Findings& findings);

#endif
