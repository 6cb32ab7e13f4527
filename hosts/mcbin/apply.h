#ifndef MCBIN_APPLY_H
#define MCBIN_APPLY_H

#include <string>
#include <vector>

class Progress;
struct ApplyOptions;

/// Reads the table once, row by row, and writes it with the bins of every attribute that has any: a column each behind
/// the others or, with the option, in place of the attribute's own. The field of a missing value is empty. The output
/// is delimited as the input is; no output stays behind if it can't be completed.
///
/// \return which attributes have no bins, and why, in words.
/// \throw Failure if the bins or a row can't be read, a column is lacking, a field is no number or a category never
///        seen, or the output can't be written. Interrupted if a signal has asked for the end.
std::vector<std::string> ApplyBins(const ApplyOptions& options, Progress& progress);

#endif
