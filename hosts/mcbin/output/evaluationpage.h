#ifndef MCBIN_EVALUATIONPAGE_H
#define MCBIN_EVALUATIONPAGE_H

#include <iosfwd>

struct Evaluation;

/// Prints a page of both populations: an overview, and for each attribute a chart and a table. It is one file without
/// script, and asks for nothing on the network.
void PrintHtml(std::ostream& os, const Evaluation& evaluation);

#endif
