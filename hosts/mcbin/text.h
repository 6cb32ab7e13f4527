#ifndef MCBIN_TEXT_H
#define MCBIN_TEXT_H

#include "bins/text.h"

#include <cstddef>
#include <string>
#include <string_view>
#include <vector>

/// Printable text escaped for a page in HTML, also within an attribute in double quotes.
std::string EscapeHtml(std::string_view text);

/// The text with spaces in front of it, or behind it, until it is `width` wide.
std::string PadLeft(const std::string& text, std::size_t width);
std::string PadRight(const std::string& text, std::size_t width);

std::vector<std::string> Split(std::string_view text, char separator);

/// Whether `name` matches the pattern, with * and ? and [] as a shell has them, or is the same.
bool Matches(const std::string& pattern, const std::string& name);

/// Whether the text has characters that make it a pattern.
bool IsPattern(std::string_view text);

/// The pattern that only `name` matches, which has such characters.
std::string EscapePattern(std::string_view name);

#endif
