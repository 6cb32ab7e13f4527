#ifndef MCBIN_DELIMITER_H
#define MCBIN_DELIMITER_H

#include <string_view>

/// The delimiter of a text whose beginning is `text`: comma, tab, semicolon or bar. It is the one that the most of the
/// first lines have as often as the header has; of equal ones the one that the header has more often, and of these the
/// first as listed. A comma if none is in the header. What stands in quotes doesn't count, nor does a last line without
/// an end. A comma that may stand in numbers is taken only if the header has none of the others.
char DetectDelimiter(std::string_view text, bool hasCommasInNumbers = false);

/// The delimiter that a user has named: a single character, or "comma", "tab", "\t", "semicolon", "bar", "pipe",
/// "space".
/// '\0' if it is none of these, or a character that can't be one.
char ParseDelimiter(std::string_view name);

#endif
