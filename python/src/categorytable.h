#ifndef MCBINNING_CATEGORYTABLE_H
#define MCBINNING_CATEGORYTABLE_H

#include <algorithm>
#include <cstddef>
#include <deque>
#include <numeric>
#include <string>
#include <string_view>
#include <unordered_map>
#include <vector>

/// The categories of a column, with their codes in the order in which they came. A table looks keys up by `View`.
template<class Key, class View>
class CategoryTable
{
public:
    CategoryTable() = default;
    // Moved keys stay in place, copied ones don't. The deque that is left behind may allocate, and so a move can fail.
    CategoryTable(CategoryTable&&) = default;            // NOLINT(performance-noexcept-move-constructor)
    CategoryTable& operator=(CategoryTable&&) = default; // NOLINT(performance-noexcept-move-constructor)

    /// The code of `key`. A key not seen before becomes a category with the next code.
    std::size_t Encode(const View& key)
    {
        const auto found = fCodes.find(key);
        if (found != fCodes.end())
            return found->second;
        fKeys.emplace_back(key);
        fCodes.emplace(View(fKeys.back()), fKeys.size() - 1);
        return fKeys.size() - 1;
    }

    std::size_t GetSize() const { return fKeys.size(); }

    /// By code: the place of the category among all in ascending order.
    std::vector<std::size_t> GetRanks() const
    {
        std::vector<std::size_t> order(fKeys.size());
        std::iota(order.begin(), order.end(), std::size_t(0));
        std::sort(order.begin(), order.end(), [this](std::size_t a, std::size_t b) { return fKeys[a] < fKeys[b]; });
        std::vector<std::size_t> ranks(fKeys.size());
        for (std::size_t rank = 0; rank < order.size(); ++rank) ranks[order[rank]] = rank;
        return ranks;
    }

    std::vector<Key> GetSorted() const
    {
        std::vector<Key> sorted(fKeys.begin(), fKeys.end());
        std::sort(sorted.begin(), sorted.end());
        return sorted;
    }

private:
    std::deque<Key> fKeys; ///< by code; a deque, as the keys of fCodes may point into it
    std::unordered_map<View, std::size_t> fCodes;
};

using NumberCategories = CategoryTable<double, double>;
using TextCategories = CategoryTable<std::string, std::string_view>;

#endif
