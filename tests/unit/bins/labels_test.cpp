#include "bins/dates.h"
#include "bins/labels.h"

#include "tests/support/samplebins.h"

#include <gtest/gtest.h>

#include <limits>

namespace
{

using Labels = std::vector<std::string>;

constexpr double kInfinity = std::numeric_limits<double>::infinity();

std::vector<std::vector<double>> Weights(const std::vector<double>& cutPoints)
{
    return std::vector<std::vector<double>>(cutPoints.size() + 1, {1.0});
}

Labels LabelsOf(const std::vector<double>& cutPoints, bool isRightClosed, ValueKind kind = ValueKind::kNumber)
{
    const auto attribute = AVariable("x");
    attribute->valueKind = kind;
    return MakeLabels(SomeBins(attribute, nullptr, cutPoints, Weights(cutPoints), isRightClosed));
}

Labels ColumnsOf(const Bins& bins, const std::vector<std::string>& taken)
{
    Labels names;
    for (const BinColumn& column : MakeBinColumns(bins, taken)) names.push_back(column.name);
    return names;
}

} // namespace

TEST(Labels, BracketStandsAtTheClosedEndAndInfinitiesHaveBinsForThemselves)
{
    EXPECT_EQ((Labels{"(-inf, +inf)"}), LabelsOf({}, true));
    EXPECT_EQ((Labels{"(-inf, 1.5]", "(1.5, 1e+20]", "(1e+20, +inf)"}), LabelsOf({1.5, 1e20}, true));
    EXPECT_EQ((Labels{"(-inf, 100000)", "[100000, +inf)"}), LabelsOf({1e5}, false));
    EXPECT_EQ((Labels{"[-inf, -inf]", "(-inf, 0]", "(0, +inf)"}), LabelsOf({-kInfinity, 0}, true));
    EXPECT_EQ((Labels{"(-inf, 0)", "[0, +inf)", "[+inf, +inf]"}), LabelsOf({0, kInfinity}, false));
}

TEST(Labels, BordersBetweenTwoDaysAreTheNearestThatPartTheDates)
{
    EXPECT_EQ((Labels{"(-inf, 1970-01-02]", "(1970-01-02, +inf)"}), LabelsOf({1.5}, true, ValueKind::kDate));
    EXPECT_EQ((Labels{"(-inf, 1970-01-03)", "[1970-01-03, +inf)"}), LabelsOf({1.5}, false, ValueKind::kDate));
    EXPECT_EQ((Labels{"(-inf, 1970-01-01 00:00:00.000001]", "(1970-01-01 00:00:00.000001, +inf)"}),
              LabelsOf({1.5}, true, ValueKind::kTimestamp));
    EXPECT_EQ((Labels{"(-inf, 1e+300]", "(1e+300, +inf)"}), LabelsOf({1e300}, true, ValueKind::kDate));
}

TEST(Labels, CategoriesAreListedInTheirBins)
{
    const auto colour = AVariable("colour", VariableKind::kStringCategorical, {"blue", "green", "red"});
    EXPECT_EQ((Labels{"{blue}", "{green, red}"}), MakeLabels(SomeBins(colour, nullptr, {0}, {{1}, {2}})));
    EXPECT_EQ((Labels{"{blue, green}", "{red}"}), MakeLabels(SomeBins(colour, nullptr, {2}, {{1}, {2}}, false)));
    const auto flag = AVariable("flag", VariableKind::kNumericCategorical, {"0", "1"});
    flag->valueKind = ValueKind::kBoolean;
    EXPECT_EQ((Labels{"{false}", "{true}"}), MakeLabels(SomeBins(flag, nullptr, {0.5}, {{1}, {2}})));
}

TEST(Labels, TextsOfAHostReplaceTheBorders)
{
    AttributeBins bins = SomeBins(AVariable("at"), nullptr, {5}, {{1}, {1}});
    bins.borderTexts = {"1970-01-01 01:00+01:00"};
    EXPECT_EQ((Labels{"(-inf, 1970-01-01 01:00+01:00]", "(1970-01-01 01:00+01:00, +inf)"}), MakeLabels(bins));
}

TEST(Labels, ColumnsOfBinsHaveNamesOfTheirOwn)
{
    const auto age = AVariable("age");
    const auto target = AVariable("bought", VariableKind::kStringCategorical, {"no", "yes"});
    const auto other = AVariable("moved", VariableKind::kStringCategorical, {"no", "yes"});
    Bins bins;
    bins.results = {SomeBins(age, target, {}, {{1, 1}}), SomeBins(AVariable("age_bin"), target, {}, {}),
                    SomeBins(AVariable("x"), target, {1}, {{1, 1}, {0, 1}})};

    EXPECT_EQ((Labels{"age_bin", "x_bin"}), ColumnsOf(bins, {"age"}));
    EXPECT_EQ((Labels{"age_bin_3", "x_bin"}), ColumnsOf(bins, {"age_bin", "age_bin_2"}));
    EXPECT_EQ((Labels{"'age_bin' has no bins: OK"}), DescribeUnbinned(bins));

    bins.results.push_back(SomeBins(age, other, {1}, {{1, 1}, {0, 1}}));
    EXPECT_EQ((Labels{"age_by_bought_bin", "x_by_bought_bin", "age_by_moved_bin"}), ColumnsOf(bins, {}));
}

TEST(Dates, DaysAreThoseOfTheGregorianCalendar)
{
    struct Case
    {
        double days;
        const char* date;
    };
    const Case cases[] = {{0, "1970-01-01"},      {-1, "1969-12-31"},      {59, "1970-03-01"},
                          {789, "1972-02-29"},    {10957, "2000-01-01"},   {11016, "2000-02-29"},
                          {11017, "2000-03-01"},  {19722.9, "2023-12-31"}, {-25567, "1900-01-01"},
                          {-25508, "1900-03-01"}, {-719162, "0001-01-01"}, {2932896, "9999-12-31"}};
    for (const Case& c : cases) EXPECT_EQ(c.date, FormatDate(c.days).value_or("none")) << c.days;
    for (const double days : {-719163.0, 2932897.0, 1e300, kInfinity, std::numeric_limits<double>::quiet_NaN()})
        EXPECT_FALSE(FormatDate(days)) << days;

    EXPECT_EQ("1970-01-01 00:00:00", FormatTimestamp(0));
    EXPECT_EQ("1969-12-31 23:59:59.999999", FormatTimestamp(-1));
    EXPECT_EQ("2024-02-29 12:34:56.000007", FormatTimestamp(1709210096000007));
    EXPECT_FALSE(FormatTimestamp(1e300));
}
