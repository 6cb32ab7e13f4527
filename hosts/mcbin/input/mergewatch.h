#ifndef MCBIN_MERGEWATCH_H
#define MCBIN_MERGEWATCH_H

#include <cmath>
#include <optional>
#include <string>
#include <string_view>
#include <unordered_map>
#include <utility>

/// Watches the fields of a column for different whole numbers that become one double, as there are from 2^53 on. It
/// keeps the first 65536 different numbers of that size, and so may miss it in a column of more.
class MergeWatch
{
public:
    /// The first two numbers that have become one, as they are written.
    using Merged = std::optional<std::pair<std::string, std::string>>;

    /// `number` is what has been read from `text`.
    void Look(std::string_view text, double number)
    {
        constexpr double kFirstInexact = 9007199254740992.0;
        if (std::fabs(number) >= kFirstInexact && !fMerged)
            LookCloser(text, number);
    }

    const Merged& GetMerged() const { return fMerged; }

private:
    void LookCloser(std::string_view text, double number);

    std::unordered_map<double, std::string> fWritten; ///< the digits of each number seen
    Merged fMerged;
};

#endif
