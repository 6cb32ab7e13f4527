#ifndef MCBIN_TERMINAL_H
#define MCBIN_TERMINAL_H

#include <cstddef>
#include <optional>

bool IsTerminal(int descriptor);

/// The width of the terminal in columns, at least 40; nothing if the descriptor is no terminal.
std::optional<std::size_t> GetTerminalWidth(int descriptor);

/// Whether colours are wanted: the descriptor is a terminal that is not called dumb, and NO_COLOR is not set.
bool HasColours(int descriptor);

#endif
