#ifndef MCBIN_EVALUATIONTABLE_H
#define MCBIN_EVALUATIONTABLE_H

#include "hosts/mcbin/output/tableoutput.h"

#include <iosfwd>

struct Evaluation;

/// Prints a table for each attribute, with both populations side by side, and what should be looked at. Columns that a
/// narrow screen has no room for are left out.
void PrintTables(std::ostream& os, const Evaluation& evaluation, const Screen& screen);

#endif
