#include "hosts/mcbin/input/delimiter.h"

#include <algorithm>
#include <array>
#include <tuple>
#include <utility>
#include <vector>

namespace
{

constexpr std::array<char, 4> kDelimiters{',', '\t', ';', '|'};
constexpr std::size_t kMostLines = 50;

using Counts = std::array<long, kDelimiters.size()>;

/// Of each line that has an end and isn't blank: how often it has each delimiter outside of quotes.
std::vector<Counts> CountInLines(std::string_view text)
{
    std::vector<Counts> lines;
    Counts counts{};
    bool isQuoted = false;
    bool isBlank = true;
    for (const char c : text)
    {
        if (c == '"')
            isQuoted = !isQuoted; // a doubled one does so twice
        if (isQuoted)
            continue;
        const auto found = std::find(kDelimiters.begin(), kDelimiters.end(), c);
        if (found != kDelimiters.end())
            ++counts[static_cast<std::size_t>(found - kDelimiters.begin())];
        const bool isEnd = c == '\n' || c == '\r';
        isBlank = isBlank && isEnd;
        if (!isEnd || isBlank)
            continue;
        lines.push_back(std::exchange(counts, {}));
        isBlank = true;
        if (lines.size() == kMostLines)
            break;
    }
    if (lines.empty())
        lines.push_back(counts);
    return lines;
}

} // namespace

char DetectDelimiter(std::string_view text, bool hasCommasInNumbers)
{
    const std::vector<Counts> lines = CountInLines(text);
    const Counts& header = lines.front();
    char best = ',';
    std::pair<long, long> bestRank(0, 0);
    for (std::size_t i = 0; i < kDelimiters.size(); ++i)
    {
        const auto isAlike = [&](const Counts& line) { return line[i] == header[i]; };
        const bool isInNumbers = hasCommasInNumbers && kDelimiters[i] == ',';
        const std::pair<long, long> rank(isInNumbers ? 0 : std::count_if(lines.begin(), lines.end(), isAlike),
                                         header[i]);
        if (header[i] > 0 && rank > bestRank)
            std::tie(best, bestRank) = std::pair(kDelimiters[i], rank);
    }
    return best;
}

char ParseDelimiter(std::string_view name)
{
    constexpr std::array<std::pair<std::string_view, char>, 7> kNames{{{"comma", ','},
                                                                       {"tab", '\t'},
                                                                       {"\\t", '\t'},
                                                                       {"semicolon", ';'},
                                                                       {"bar", '|'},
                                                                       {"pipe", '|'},
                                                                       {"space", ' '}}};
    for (const auto& [known, delimiter] : kNames)
    {
        if (name == known)
            return delimiter;
    }
    const bool isOne = name.size() == 1 && name != "\"" && name != "\n" && name != "\r" && name != "\0";
    return isOne ? name.front() : '\0';
}
