#ifndef MCOBNQRT_BINS_CATEGORYORDER_H
#define MCOBNQRT_BINS_CATEGORYORDER_H

#include <cstddef>
#include <cstdint>
#include <optional>
#include <string>
#include <vector>

/// In which order the categories of an attribute get their codes, so that a cut between neighbours means something. The
/// categories have no order of their own.
///
/// With two categories of the target they ascend by their rate: the share that the target's second category has of
/// their weight. With k of them each category of the attribute is a point, the vector of its k shares p_i, of weight
/// w_i. The points ascend along their first principal direction v, the eigenvector of the largest eigenvalue of
///
///     C = sum_i w_i (p_i - m) (p_i - m)^T / sum_i w_i        with m the vector of shares of all categories together,
///
/// which is the line that keeps most of their variance. Of v and -v that one is taken in which the last component with
/// at least a tenth of the largest absolute value is positive: with two categories this is the order by rate.
///
/// Equal rates, or positions on v, leave the order as it is. A category without weight counts as one that has the
/// shares of all together.
///
/// \param weights by code: the weights of a category by category of the target. Each sum of them is exact, so the order
///        does not depend on that of the records.
/// \return the codes in their new order.
std::vector<std::size_t> OrderByRate(const std::vector<std::vector<double>>& weights);

/// A run takes the codes from 0 to 255.
inline constexpr std::size_t kMostCategories = 256;

/// Why a column of text that nobody has named is not binned, as in "more than 256 categories"; empty if it is. Of each
/// category there has to be a rate to tell: with fewer than five records for a category on average, as in a column of
/// identifiers, the rates are chance. Texts among numbers that outnumber them, such as "none" among measurements, are
/// no categories either.
///
/// \param categories the different texts; if there are too many, at least one more than a run takes.
/// \param numRecords how many records have one.
std::string DescribeUnusable(const std::vector<std::string>& categories, std::int64_t numRecords);

/// The categories of an attribute as they get their codes.
struct CategoryCodes
{
    std::vector<std::string> names;      ///< by code
    std::optional<std::size_t> rareCode; ///< the code that rare categories share
    std::vector<std::string> rare;       ///< they themselves, in the order in which they came
};

/// Gives the categories their codes. Those of less than `rareShare` of the weight of all share one, which is called
/// "(rare)", or "(rare 2)" and so on where a category has the name; nothing else changes where none is rare.
///
/// \param categories in their order; what is rare goes to the position that its name has among texts, or without
///        `areTexts` to the end.
/// \param weights of the categories, by category of the target.
/// \param isByRate whether OrderByRate() orders them then.
CategoryCodes MakeCategoryCodes(const std::vector<std::string>& categories,
                                const std::vector<std::vector<double>>& weights, bool areTexts, double rareShare,
                                bool isByRate);

#endif
