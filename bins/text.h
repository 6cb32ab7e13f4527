#ifndef MCOBNQRT_BINS_TEXT_H
#define MCOBNQRT_BINS_TEXT_H

#include <cstddef>
#include <string>
#include <string_view>
#include <vector>

/// Text of the data made fit for a terminal line: control characters, such as line ends, characters that set the
/// direction of writing, and bytes that are not UTF-8 become escapes like "\x0a" and "\u202e".
std::string Printable(std::string_view text);

/// Printable text in single quotes, for a message.
std::string Quote(std::string_view text);

/// The beginning of a text that is wider than `width` columns, with "..." behind it.
std::string Shorten(std::string_view text, std::size_t width = 30);

std::string Join(const std::vector<std::string>& parts, std::string_view separator);

/// The text between two of `quote`, where one that is part of it is doubled.
std::string Enclose(std::string_view text, char quote);

#endif
