#ifndef MCBIN_REPORT_H
#define MCBIN_REPORT_H

#include <iosfwd>
#include <vector>

class BINAttributeResults;
class BINAttributeTargetResults;
class BINVarList;
struct TableProfile;

/// Prints the results for a person to read: for each a table with a line per bin, what its status says, and a line of
/// figures. The bins hold their right border. `list` is the one that was run on; it names the variables and categories.
void PrintResults(std::ostream& os, const BINVarList& list, const std::vector<BINAttributeTargetResults>& results);
void PrintResults(std::ostream& os, const BINVarList& list, const std::vector<BINAttributeResults>& results);

/// Names the columns that took no part, each with the field that is the reason. Prints nothing if there are none.
void PrintLeftOut(std::ostream& os, const TableProfile& profile);

#endif
