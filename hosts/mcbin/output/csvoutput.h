#ifndef MCBIN_CSVOUTPUT_H
#define MCBIN_CSVOUTPUT_H

#include <iosfwd>
#include <string>
#include <string_view>

struct Findings;

/// The field as it stands in a delimited file: in quotes if it must be.
std::string QuoteField(std::string_view field, char delimiter);

/// Prints a row for each bin of each attribute that was binned, with a header. The weight of each category of the
/// target has a column of its own, "weight:CATEGORY", or "weight:TARGET=CATEGORY" if there is more than one target.
void PrintCsv(std::ostream& os, const Findings& findings);

#endif
