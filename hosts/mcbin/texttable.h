#ifndef MCBIN_TEXTTABLE_H
#define MCBIN_TEXTTABLE_H

#include <iosfwd>
#include <string>
#include <string_view>
#include <vector>

/// Text of the data made fit for a terminal line: control characters, such as line ends, become escapes like "\x0a".
std::string Printable(std::string_view text);

/// The same in single quotes, for a message.
std::string Quote(std::string_view text);

/// Prints the rows, all of one length, in columns as wide as their widest cell: the first one to the left, the others to
/// the right, everything indented by two spaces. Each code point of UTF-8 counts as one character wide.
void PrintTextTable(std::ostream& os, const std::vector<std::vector<std::string>>& rows);

#endif
