#ifndef MCBIN_COLUMNS_H
#define MCBIN_COLUMNS_H

#include <cstddef>
#include <string>
#include <vector>

// Tables in columns that stand straight, also with wide characters.

using Rows = std::vector<std::vector<std::string>>;

/// The width of each column: that of its widest cell.
std::vector<std::size_t> GetWidths(const Rows& rows);

/// The cells of a row in their columns: the first to the left, the others to the right.
std::string Align(const std::vector<std::string>& row, const std::vector<std::size_t>& widths);

#endif
