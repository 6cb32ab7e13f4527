#ifndef MCOBNQRT_BINS_JSONNAMES_H
#define MCOBNQRT_BINS_JSONNAMES_H

#include "bins/bins.h"
#include "bins/rows.h"

#include <utility>

// What the values that are told by name are called in JSON.

template<class Value, std::size_t kSize>
using Names = std::pair<const char*, Value>[kSize];

inline constexpr Names<Method, 2> kMethodNames = {{"supervised", Method::kSupervised},
                                                  {"equal-frequency", Method::kEqualFrequency}};

inline constexpr Names<bool, 2> kClosedNames = {{"right", true}, {"left", false}};

inline constexpr Names<VariableKind, 4> kKindNames = {{"continuous", VariableKind::kContinuous},
                                                      {"string-categorical", VariableKind::kStringCategorical},
                                                      {"numeric-categorical", VariableKind::kNumericCategorical},
                                                      {"weight", VariableKind::kWeight}};

inline constexpr Names<VariableRole, 3> kRoleNames = {
    {"attribute", VariableRole::kAttribute}, {"target", VariableRole::kTarget}, {"weight", VariableRole::kWeight}};

inline constexpr Names<CategoryOrder, 3> kCategoryOrderNames = {
    {"text", CategoryOrder::kText}, {"rate", CategoryOrder::kRate}, {"declared", CategoryOrder::kDeclared}};

inline constexpr Names<ValueKind, 3> kValueKindNames = {
    {"boolean", ValueKind::kBoolean}, {"date", ValueKind::kDate}, {"timestamp", ValueKind::kTimestamp}};

inline constexpr Names<BinRow::Kind, 4> kRowNames = {{"bin", BinRow::Kind::kBin},
                                                     {"missing", BinRow::Kind::kMissing},
                                                     {"unseen", BinRow::Kind::kUnseen},
                                                     {"total", BinRow::Kind::kTotal}};

/// What weights are scaled to; what is not has no name.
inline constexpr Names<bool, 1> kScaleNames = {{"rows", true}};

/// Whether cut points are rounded; those that are not have no name.
inline constexpr Names<bool, 1> kRoundNames = {{"auto", true}};

/// Whether numbers of distinct values are exact.
inline constexpr Names<bool, 2> kDistinctNames = {{"exact", true}, {"approximate", false}};

/// The name of the value, or null if it has none.
template<class Value, std::size_t kSize>
const char* GetName(const std::pair<const char*, Value> (&names)[kSize], Value value)
{
    for (const auto& [name, named] : names)
    {
        if (named == value)
            return name;
    }
    return nullptr;
}

#endif
