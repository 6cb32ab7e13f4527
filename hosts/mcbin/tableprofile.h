#ifndef MCBIN_TABLEPROFILE_H
#define MCBIN_TABLEPROFILE_H

#include <cstddef>
#include <functional>
#include <optional>
#include <set>
#include <string>
#include <vector>

class TableReader;

/// What the fields of one column are.
struct Column
{
    std::string name;
    bool isTarget = false;
    bool isNumeric = true;  ///< every field that isn't empty is a number; not found out for a target
    std::string firstText;  ///< of a column that isn't numeric: its first field that is no number
    long firstTextLine = 0; ///< and the line of that
    std::set<std::string, std::less<>> categories; ///< of a target: its different fields that aren't empty
};

/// What must be known of a table before its records can be handed out.
struct TableProfile
{
    std::vector<Column> columns;
    long nRows = 0; ///< without the header
};

/// Reads the table to its end. `target` is the place of the target, if there is one. Memory doesn't grow with the number
/// of rows.
///
/// \throw Failure if a row is bad, if there is no row, or if the target has more categories than the library takes.
TableProfile ProfileTable(TableReader& table, std::optional<std::size_t> target);

#endif
