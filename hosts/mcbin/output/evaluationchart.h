#ifndef MCBIN_EVALUATIONCHART_H
#define MCBIN_EVALUATIONCHART_H

#include "bins/evaluation.h"

#include <iosfwd>
#include <string>
#include <vector>

/// Draws the shares of both populations side by side, row by row, and their rates as lines above.
void PrintChart(std::ostream& os, const std::vector<EvaluationRow>& rows, const std::string& title);

#endif
