#ifndef MCBIN_TERMINAL_H
#define MCBIN_TERMINAL_H

#include <cstddef>
#include <optional>

bool IsTerminal(int descriptor);

/// The width of the terminal in columns, at least 40; nothing if it is none.
std::optional<std::size_t> GetTerminalWidth(int descriptor);

/// Whether colours are wanted: it is a terminal that isn't a dumb one, and NO_COLOR isn't set.
bool HasColours(int descriptor);

#endif
