#include "bins/categoryorder.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <numeric>
#include <random>

namespace
{

using Codes = std::vector<std::size_t>;
using Names = std::vector<std::string>;
using Weights = std::vector<std::vector<double>>;

} // namespace

TEST(CategoryOrder, AscendsByTheRateOfTheSecondCategory)
{
    struct Case
    {
        const char* what;
        Weights weights;
        Codes order;
    };
    const Case cases[] = {
        {"rates 0.5, 0.25, 0.75", {{1, 1}, {3, 1}, {1, 3}}, {1, 0, 2}},
        {"equal rates of different weights keep their order", {{2, 1}, {4, 2}, {1, 0}, {20, 10}}, {2, 0, 1, 3}},
        {"a category without weight has the rate of all, 0.5", {{0, 0}, {0, 9}, {9, 0}}, {2, 0, 1}},
        {"no weight at all", {{0, 0}, {0, 0}}, {0, 1}},
        {"without a target", {{3}, {1}}, {0, 1}},
        {"no category", {}, {}},
    };
    for (const Case& one : cases) EXPECT_EQ(one.order, OrderByRate(one.weights)) << one.what;
}

TEST(CategoryOrder, OfSeveralCategoriesFollowsTheDirectionOfTheirLargestVariance)
{
    struct Case
    {
        const char* what;
        Weights weights;
        Codes order;
    };
    const Case cases[] = {
        // The shares lie on the line from (1, 0, 0) to (0, 0, 1).
        {"a line", {{5, 0, 5}, {0, 0, 4}, {9, 0, 1}, {2, 0, 0}}, {3, 2, 0, 1}},
        // The second category's share varies by 0.8, the others' by half of that: v is (-1, 2, -1) / sqrt(6), whose
        // last component is more than a tenth of the largest, and so is made positive.
        {"a middle category", {{1, 8, 1}, {5, 0, 5}, {3, 4, 3}}, {0, 2, 1}},
        // The heavy categories differ in the first two shares, the light ones in the last: the heavy ones decide.
        {"weights decide", {{900, 100, 0}, {100, 900, 0}, {0, 0, 1}, {1, 1, 0}}, {0, 2, 3, 1}},
        {"all alike", {{2, 2, 2}, {1, 1, 1}, {3, 3, 3}}, {0, 1, 2}},
    };
    for (const Case& one : cases) EXPECT_EQ(one.order, OrderByRate(one.weights)) << one.what;
}

/// With a third category that is nowhere, the direction is that of two.
TEST(CategoryOrder, AgreesOnTwoCategoriesWithAndWithoutAnEmptyThird)
{
    const unsigned int seed = 20261123;
    std::mt19937 random(seed);
    std::uniform_int_distribution<int> weight(1, 1000);
    for (int run = 0; run < 100; ++run)
    {
        Weights two;
        Weights three;
        for (int i = 0; i < 20; ++i)
        {
            two.push_back({static_cast<double>(weight(random)), static_cast<double>(weight(random))});
            three.push_back({two.back()[0], two.back()[1], 0.0});
        }
        EXPECT_EQ(OrderByRate(two), OrderByRate(three)) << "seed " << seed << ", run " << run;
    }
}

TEST(CategoryOrder, KeepsMoreVarianceThanAnyOtherDirection)
{
    const unsigned int seed = 7;
    std::mt19937 random(seed);
    std::uniform_int_distribution<int> weight(1, 100);
    Weights weights;
    for (int i = 0; i < 12; ++i)
    {
        weights.emplace_back();
        for (int j = 0; j < 5; ++j) weights.back().push_back(weight(random));
    }
    const Codes order = OrderByRate(weights);

    // The best of many random directions nearly is the principal one, so it orders the categories in the same way but
    // for neighbours that lie close to each other.
    const auto sum = [](const std::vector<double>& row) { return std::accumulate(row.begin(), row.end(), 0.0); };
    std::vector<double> all(5);
    for (const auto& row : weights)
    {
        for (std::size_t j = 0; j < 5; ++j) all[j] += row[j];
    }
    const double total = sum(all);
    std::normal_distribution<double> normal;
    double best = 0.0;
    std::vector<double> positions;
    for (int trial = 0; trial < 200000; ++trial)
    {
        std::vector<double> direction(5);
        for (double& component : direction) component = normal(random);
        const double length = std::sqrt(std::inner_product(direction.begin(), direction.end(), direction.begin(), 0.0));
        const double mean = std::inner_product(all.begin(), all.end(), direction.begin(), 0.0) / length / total;
        std::vector<double> tried;
        double variance = 0.0;
        for (const auto& row : weights)
        {
            tried.push_back(std::inner_product(row.begin(), row.end(), direction.begin(), 0.0) / length / sum(row));
            variance += sum(row) * (tried.back() - mean) * (tried.back() - mean);
        }
        if (variance > best)
        {
            best = variance;
            positions = tried;
        }
    }
    const auto [low, high] = std::minmax_element(positions.begin(), positions.end());
    const double margin = 0.05 * (*high - *low);
    const double sign = positions[order.front()] < positions[order.back()] ? 1.0 : -1.0;
    for (std::size_t i = 1; i < order.size(); ++i)
        EXPECT_GT(sign * (positions[order[i]] - positions[order[i - 1]]), -margin) << "seed " << seed << ", " << i;
}

TEST(CategoryOrder, RareCategoriesShareACode)
{
    const Names names{"a", "b", "c", "d"};
    const Weights weights{{40, 10}, {1, 2}, {10, 32}, {3, 2}};

    const CategoryCodes byText = MakeCategoryCodes(names, weights, true, 0.06, false);
    EXPECT_EQ((Names{"(rare)", "a", "c"}), byText.names);
    EXPECT_EQ((Names{"b", "d"}), byText.rare);
    EXPECT_EQ(0u, byText.rareCode);

    // Rates 0.2, 0.76 and, of the rare, 4 / 8.
    const CategoryCodes byRate = MakeCategoryCodes(names, weights, true, 0.06, true);
    EXPECT_EQ((Names{"a", "(rare)", "c"}), byRate.names);
    EXPECT_EQ(1u, byRate.rareCode);

    const CategoryCodes declared = MakeCategoryCodes({"d", "c", "b", "a"}, weights, false, 0.06, false);
    EXPECT_EQ((Names{"d", "b", "(rare)"}), declared.names);
    EXPECT_EQ(2u, declared.rareCode);

    const CategoryCodes none = MakeCategoryCodes(names, weights, true, 0.03, false); // 3 of 100 are no less than that
    EXPECT_EQ(names, none.names);
    EXPECT_EQ(std::nullopt, none.rareCode);

    const CategoryCodes named = MakeCategoryCodes({"(rare)", "b", "c", "d"}, weights, true, 0.06, false);
    EXPECT_EQ((Names{"(rare 2)", "(rare)", "c"}), named.names) << "by bytes";
}
