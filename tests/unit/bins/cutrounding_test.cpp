// The shortest decimal between two values.

#include "bins/cutrounding.h"

#include "bins/numbers.h"
#include "tests/support/samplebins.h"

#include <gtest/gtest.h>

#include <cmath>
#include <cstdint>
#include <cstring>
#include <limits>
#include <random>
#include <string>

namespace
{

constexpr double kInf = std::numeric_limits<double>::infinity();
constexpr double kMax = std::numeric_limits<double>::max();
constexpr double kLeast = std::numeric_limits<double>::denorm_min();

/// How many digits it takes to write the number, leading and trailing zeros left out.
std::size_t CountDigits(double number)
{
    std::string digits;
    const std::string text = FormatNumber(number);
    for (const char c : text.substr(0, text.find('e')))
    {
        if (c >= '0' && c <= '9' && !(digits.empty() && c == '0'))
            digits += c;
    }
    const std::size_t last = digits.find_last_not_of('0');
    return last == std::string::npos ? 0 : last + 1;
}

} // namespace

TEST(CutRounding, TheShortestDecimalIsTheOneNextToTheCutPoint)
{
    const struct
    {
        double below, above, cutPoint;
        bool isRightClosed;
        double expected;
    } cases[] = {
        {26, 41, 26, true, 30},
        {26, 41, 41, false, 40},
        {34.4871, 34.6112, 34.4871, true, 34.5},
        {25, 35, 30, true, 30},
        {-0.3, 0.2, -0.3, true, 0},
        {-41, -26, -41, true, -40},
        {1234567, 1234568, 1234567, true, 1234567},    // nothing shorter fits between
        {30, 31, 30, true, 30},                        // the lower value is a cut point of its own
        {29, 30, 29, true, 29},                        // and the upper one belongs to the other bin,
        {29, 30, 30, false, 30},                       // if bins are closed on the right
        {0.1, std::nextafter(0.1, 1), 0.1, true, 0.1}, // neighbours among the doubles
        {123456789012, 123456989012, 123456889012, true, 123456900000},
        {10, 100, 55, true, 50}, // of two equally near ones the lower
        {-kInf, 7.31, 7.1, true, 7.1},
        {7.31, kInf, 7.31, true, 7.31},
        {kMax / 2, kMax, kMax / 2, true, 1e308},
        {kLeast, 3 * kLeast, kLeast, true, 1e-323},
        {0, 0, 0, true, 0},
    };
    for (const auto& c : cases)
    {
        EXPECT_EQ(c.expected, FindShortestDecimal(c.below, c.above, c.cutPoint, c.isRightClosed))
            << c.below << ' ' << c.above;
    }
}

TEST(CutRounding, StaysBetweenAnyTwoDoubles)
{
    std::mt19937_64 random(7);
    for (int i = 0; i < 20000; ++i)
    {
        double values[2];
        for (double& value : values)
        {
            const std::uint64_t bits = random();
            std::memcpy(&value, &bits, sizeof(value));
            if (!std::isfinite(value))
                value = 1.0;
        }
        if (i % 2 == 0) // close together
            values[1] = values[0] * (1.0 + std::ldexp(1.0, -static_cast<int>(random() % 52)));
        const double below = std::min(values[0], values[1]);
        const double above = std::max(values[0], values[1]);
        if (!(below < above && std::isfinite(above)))
            continue;
        const double right = FindShortestDecimal(below, above, below, true);
        EXPECT_TRUE(below <= right && right < above) << below << ' ' << above;
        const bool isWrittenInFull = std::abs(below) >= 1e15; // as a whole number, with all its digits
        EXPECT_TRUE(isWrittenInFull || CountDigits(right) <= CountDigits(below)) << below << ' ' << above;
        const double left = FindShortestDecimal(below, above, above, false);
        EXPECT_TRUE(below < left && left <= above) << below << ' ' << above;
    }
}

TEST(CutRounding, OnlyCutPointsBetweenNumbersAreRounded)
{
    Evaluation evaluation;
    const auto date = AVariable("d");
    date->valueKind = ValueKind::kDate;
    evaluation.first.results = {SomeBins(AVariable("x"), nullptr, {26, 50}, {{}, {}, {}}),
                                SomeBins(date, nullptr, {26}, {{}, {}})};
    evaluation.indices = {0, 1};
    evaluation.ranges = {{{20, 26}, {}, {58, 90}}, {{20, 26}, {41, 90}}};

    const Bins rounded = RoundCutPoints(evaluation);

    EXPECT_TRUE(rounded.settings.areCutsRounded);
    EXPECT_EQ((std::vector<double>{30, 50}), rounded.results[0].cutPoints);
    EXPECT_EQ(30.0, rounded.results[0].bins[0].right);
    EXPECT_EQ(30.0, rounded.results[0].bins[1].left);
    EXPECT_EQ((std::vector<double>{26}), rounded.results[1].cutPoints);
}
