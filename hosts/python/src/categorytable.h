#ifndef MCBINNING_CATEGORYTABLE_H
#define MCBINNING_CATEGORYTABLE_H

#include <algorithm>
#include <cstddef>
#include <deque>
#include <numeric>
#include <optional>
#include <string>
#include <string_view>
#include <unordered_map>
#include <vector>

/// The order in which a column declares its categories, as an ordered categorical does.
template<class Key>
class DeclaredOrder
{
public:
    /// Takes in the dictionary of a batch. The dictionaries of two batches may differ: a key that is new goes behind
    /// its predecessor. \return false if the keys contradict the order known so far.
    bool Merge(const std::vector<Key>& keys)
    {
        if (keys == fKeys)
            return true;
        auto position = fKeys.begin();
        for (const Key& key : keys)
        {
            const auto found = std::find(position, fKeys.end(), key);
            if (found != fKeys.end())
                position = found + 1;
            else if (std::find(fKeys.begin(), position, key) != position)
                return false;
            else
                position = fKeys.insert(position, key) + 1;
        }
        return true;
    }

    bool IsEmpty() const { return fKeys.empty(); }

    /// By key: its position.
    std::unordered_map<Key, std::size_t> GetPositions() const
    {
        std::unordered_map<Key, std::size_t> positions;
        for (const Key& key : fKeys) positions.emplace(key, positions.size());
        return positions;
    }

private:
    std::vector<Key> fKeys;
};

/// The categories of a column, with their codes in the order in which they came. A table looks keys up by `View`.
template<class Key, class View>
class CategoryTable
{
public:
    CategoryTable() = default;
    // Moved keys stay in place, copied ones don't. The deque that is left behind may allocate, and so a move can fail.
    CategoryTable(CategoryTable&&) = default;            // NOLINT(performance-noexcept-move-constructor)
    CategoryTable& operator=(CategoryTable&&) = default; // NOLINT(performance-noexcept-move-constructor)

    /// The code of `key`, if it is a category.
    std::optional<std::size_t> Find(const View& key) const
    {
        const auto found = fCodes.find(key);
        return found != fCodes.end() ? std::optional(found->second) : std::nullopt;
    }

    /// The code of `key`. A key not seen before becomes a category with the next code.
    std::size_t Encode(const View& key)
    {
        if (const std::optional<std::size_t> code = Find(key))
            return *code;
        fKeys.emplace_back(key);
        fCodes.emplace(View(fKeys.back()), fKeys.size() - 1);
        return fKeys.size() - 1;
    }

    std::size_t GetSize() const { return fKeys.size(); }

    /// Declares that the categories have this order. Without it the ascending order is theirs.
    DeclaredOrder<Key>& GetDeclaredOrder() { return fDeclaredOrder; }
    const DeclaredOrder<Key>& GetDeclaredOrder() const { return fDeclaredOrder; }

    /// By code: the rank of the category in the declared or else in the ascending order.
    std::vector<std::size_t> GetRanks() const
    {
        const std::vector<std::size_t> order = SortCodes();
        std::vector<std::size_t> ranks(fKeys.size());
        for (std::size_t rank = 0; rank < order.size(); ++rank) ranks[order[rank]] = rank;
        return ranks;
    }

    /// The categories: by code if `areComplete`, and otherwise in the declared or else in the ascending order.
    std::vector<Key> GetKeys(bool areComplete) const
    {
        if (areComplete)
            return {fKeys.begin(), fKeys.end()};
        std::vector<Key> sorted;
        for (const std::size_t code : SortCodes()) sorted.push_back(fKeys[code]);
        return sorted;
    }

private:
    std::vector<std::size_t> SortCodes() const
    {
        std::vector<std::size_t> codes(fKeys.size());
        std::iota(codes.begin(), codes.end(), std::size_t(0));
        if (fDeclaredOrder.IsEmpty())
        {
            std::sort(codes.begin(), codes.end(), [this](std::size_t a, std::size_t b) { return fKeys[a] < fKeys[b]; });
            return codes;
        }
        std::vector<std::size_t> positions;
        const std::unordered_map<Key, std::size_t> declared = fDeclaredOrder.GetPositions();
        for (const Key& key : fKeys) positions.push_back(declared.at(key));
        std::sort(codes.begin(), codes.end(),
                  [&](std::size_t a, std::size_t b) { return positions[a] < positions[b]; });
        return codes;
    }

    DeclaredOrder<Key> fDeclaredOrder;
    std::deque<Key> fKeys; ///< by code; a deque, as the keys of fCodes may point into it
    std::unordered_map<View, std::size_t> fCodes;
};

using NumberCategories = CategoryTable<double, double>;
using TextCategories = CategoryTable<std::string, std::string_view>;

#endif
