#include "hosts/mcbin/spelling.h"

#include <algorithm>
#include <numeric>
#include <utility>

namespace
{

/// How many letters must be put in, taken out or replaced to make one word of the other.
std::size_t GetDistance(const std::string& left, const std::string& right)
{
    std::vector<std::size_t> row(right.size() + 1); // by end of right: the distance from left up to letter i
    std::iota(row.begin(), row.end(), std::size_t(0));
    for (std::size_t i = 0; i < left.size(); ++i)
    {
        std::size_t diagonal = std::exchange(row[0], i + 1);
        for (std::size_t j = 0; j < right.size(); ++j)
        {
            const std::size_t replaced = diagonal + (left[i] == right[j] ? 0 : 1);
            diagonal = row[j + 1];
            row[j + 1] = std::min({replaced, row[j] + 1, row[j + 1] + 1});
        }
    }
    return row.back();
}

/// Whether the word is the beginning of the name, or is mistyped in no more than every third letter of it.
bool IsNear(const std::string& word, const std::string& name)
{
    const bool isBeginning = !word.empty() && name.compare(0, word.size(), word) == 0;
    return isBeginning || GetDistance(word, name) <= std::max<std::size_t>(2, name.size() / 3);
}

} // namespace

std::optional<std::string> FindNear(const std::string& word, const std::vector<std::string>& names)
{
    const auto near =
        std::find_if(names.begin(), names.end(), [&](const std::string& name) { return IsNear(word, name); });
    return near == names.end() ? std::nullopt : std::optional(*near);
}
