#ifndef MCBIN_HTMLREPORT_H
#define MCBIN_HTMLREPORT_H

#include <iosfwd>

struct Outcome;

/// Prints the outcome as one page that needs nothing else to be read: an overview in the order of the gain, then for
/// each attribute with cut points a chart and the table of its bins.
void PrintHtml(std::ostream& os, const Outcome& outcome);

#endif
