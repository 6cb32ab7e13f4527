#ifndef MCBIN_TABLEOUTPUT_H
#define MCBIN_TABLEOUTPUT_H

#include <cstddef>
#include <iosfwd>
#include <optional>

struct Outcome;

/// Where the tables are read.
struct Screen
{
    std::optional<std::size_t> width; ///< nothing if lines may be as long as they like
    bool hasColours = false;
};

/// Prints the outcome for a person to read: the attributes in the order of their gain, each with a row for each bin,
/// then in a line each those that have no cut points, and the columns that were left out. Weights, borders and
/// entropies are exact; gains, shares and what follows from shares are rounded. Texts of the data are printable, also
/// where standard output is no terminal: a file of tables is shown on one later.
void PrintTables(std::ostream& os, const Outcome& outcome, const Screen& screen);

#endif
