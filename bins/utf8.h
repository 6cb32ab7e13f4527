#ifndef MCOBNQRT_BINS_UTF8_H
#define MCOBNQRT_BINS_UTF8_H

#include <cstddef>
#include <string_view>

struct CodePoint
{
    char32_t value;
    std::size_t size; ///< in bytes
    bool isValid;     ///< false for a single byte that begins no UTF-8
};

/// What the text, which must not be empty, begins with.
CodePoint GetFirst(std::string_view text);

/// Whether it is UTF-8 without a NUL, which every form of output can hold and every program can read.
bool IsText(std::string_view text);

/// How many columns of a terminal the text takes: two for a wide character, none for an accent by itself.
std::size_t GetWidth(std::string_view text);

/// The longest beginning of the text that is not wider.
std::string_view Clip(std::string_view text, std::size_t width);

#endif
