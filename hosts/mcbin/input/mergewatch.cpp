#include "hosts/mcbin/input/mergewatch.h"

#include <algorithm>

namespace
{

/// The digits of a whole number without its sign, which the double has, and without zeros in front. Empty for other
/// ways to write a number.
std::string_view GetDigits(std::string_view text)
{
    const std::size_t begin = text.find_first_not_of(" +-0");
    const std::size_t end = text.find_last_not_of(' ');
    if (begin == std::string_view::npos)
        return "";
    const std::string_view digits = text.substr(begin, end + 1 - begin);
    return std::all_of(digits.begin(), digits.end(), [](char c) { return c >= '0' && c <= '9'; }) ? digits : "";
}

} // namespace

void MergeWatch::LookCloser(std::string_view text, double number)
{
    constexpr std::size_t kMostNumbers = 1 << 16;
    const std::string_view digits = GetDigits(text);
    if (digits.empty())
        return;
    const auto found = fWritten.find(number);
    if (found != fWritten.end() && found->second != digits)
        fMerged.emplace(found->second, digits);
    else if (found == fWritten.end() && fWritten.size() < kMostNumbers)
        fWritten.emplace(number, digits);
}
