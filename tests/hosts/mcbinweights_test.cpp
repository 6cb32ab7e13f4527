#include "tests/hosts/mcbinrun.h"

#include <algorithm>
#include <cmath>
#include <random>
#include <vector>

// Weights count with their fractions, on a grid on which every sum is exact.

namespace
{

class McbinWeights : public Mcbin
{
protected:
    std::string GetCutPoints(const std::string& arguments) const
    {
        return Shell("mcbin " + arguments + " --format json | grep cut_points").out;
    }
};

struct Rows
{
    std::vector<std::string> lines;

    std::string Text() const
    {
        std::string text = "x,y,w\n";
        for (const std::string& line : lines) text += line + "\n";
        return text;
    }
};

/// Values with ties, and weights that no sum of doubles holds exactly.
Rows MakeRows(std::mt19937& random)
{
    Rows rows;
    for (int i = 0; i < 500; ++i)
    {
        const int x = std::uniform_int_distribution(0, 40)(random);
        const int noise = std::uniform_int_distribution(0, 25)(random);
        const double weight = std::exp(std::uniform_real_distribution(-20.0, 3.0)(random));
        rows.lines.push_back(std::to_string(x) +
                             (x + noise < 25   ? ",a,"
                              : x + noise < 45 ? ",b,"
                                               : ",c,") +
                             (i % 50 == 7 ? "" : std::to_string(weight) + std::to_string(random())));
    }
    return rows;
}

} // namespace

TEST_F(McbinWeights, AConstantWeightLeavesNothingOfACategoryThatIsGone)
{
    for (const std::string weight : {"0.7", "0.1", "3.3", "1e-9"})
    {
        Shell("sed '1s/$/,w/;2,$s/$/," + weight + "/' " EXAMPLE_DATA "/iris.csv > weighted.csv");
        for (const std::string closed : {"left", "right"})
        {
            const std::string supervised = " --target species --attributes petal_length --closed " + closed;
            const std::string equal = " --attributes petal_length --bins 7 --closed " + closed;
            if (weight == "0.7") // the criterion depends on the total, too
            {
                EXPECT_EQ(GetCutPoints("supervised " EXAMPLE_DATA "/iris.csv" + supervised),
                          GetCutPoints("supervised weighted.csv --weight w" + supervised))
                    << closed;
            }
            EXPECT_EQ(GetCutPoints("equal-frequency " EXAMPLE_DATA "/iris.csv" + equal),
                      GetCutPoints("equal-frequency weighted.csv --weight w" + equal))
                << weight << closed;
        }
    }
}

TEST_F(McbinWeights, TheOrderOfTheRowsMakesNoDifference)
{
    const unsigned int seed = std::random_device()();
    SCOPED_TRACE(seed);
    std::mt19937 random(seed);
    Rows rows = MakeRows(random);
    for (const std::string command : {"supervised --target y",
                                      "supervised --target y --closed left --bins 9 "
                                      "--distinct-threshold 5",
                                      "equal-frequency --exclude y --bins 7 --closed left"})
    {
        const std::string options = command.substr(command.find(' ')) + " --weight w --format json";
        const std::string method = command.substr(0, command.find(' '));
        const Outcome first = RunOn(rows.Text(), method, options);
        ASSERT_EQ(0, first.exitCode) << first.err;
        EXPECT_EQ("1\n", RunOn(rows.Text(), method, options + " | grep -c '\"grid\": [1-9]'").out) << first.out;
        for (int i = 0; i < 3; ++i)
        {
            std::shuffle(rows.lines.begin(), rows.lines.end(), random);
            EXPECT_EQ(first.out, RunOn(rows.Text(), method, options).out) << command;
        }
    }
}

TEST_F(McbinWeights, FractionsCountUnlessRounded)
{
    const std::string data = "x,w\n1,2.5\n2,0.4\n3,1.5\n4,0\n";
    const auto weights = [&](const std::string& options)
    {
        return RunOn(data, "equal-frequency",
                     "--bins 2 --weight w --format json " + options +
                         " | sed -n 's/.*\"weight\": \\([0-9.]*\\),.*/\\1/p'")
            .out;
    };

    // Of all, of two bins, and of the missing. The grid for 3 weights of at most 2.5 is 2^-49, and so 0.4 moves by 4e-16.
    EXPECT_EQ("4.4\n2.5\n1.9000000000000004\n0\n", weights(""));
    EXPECT_EQ("4.4\n2.5\n1.9000000000000004\n0\n", weights("--round none"));
    const Outcome table = RunOn("x,w\n1,1234567.8\n2,0.1\n2,0.2\n", "equal-frequency", "--bins 2 --weight w");
    EXPECT_NE(std::string::npos, table.out.find("(1, +inf)      0.3    0.0%")) << "few digits are enough for a person";
    EXPECT_EQ("3\n2\n1\n0\n", weights("--round truncate"));
    EXPECT_EQ("5\n3\n2\n0\n", weights("--round closest"));
    EXPECT_EQ(2, Run("equal-frequency data.csv --weight w --round up").exitCode);
}

TEST_F(McbinWeights, RowsWithoutAWeightAreLeftOutAndCounted)
{
    const std::string data = "x,w\n1,2\n2,1\n3,NA\n4,\n5,-9\n6,0\n7,900\n";
    const std::string options = "--bins 2 --weight w --missing-text NA --missing w=-9,800: ";

    const Outcome json = RunOn(data, "equal-frequency", options + "--format json");
    EXPECT_NE(std::string::npos, json.out.find("\"records\": 7, \"records_without_weight\": 4"))
        << json.out << json.err;
    EXPECT_NE(std::string::npos, json.out.find("\"weight_with_missing\": 3,")) << "a weight of 0 is one";
    EXPECT_NE(std::string::npos,
              json.out.find("\"missing\": {\"values\": [-9], \"texts\": [], \"interval\": [800, \"inf\"]}"));
    EXPECT_NE(std::string::npos,
              RunOn(data, "equal-frequency", options).out.find("Left out, as they have no weight: 4 records\n"));
    const Outcome page = RunOn(data, "equal-frequency", options + "--report page.html && cat page.html");
    EXPECT_NE(std::string::npos, page.out.find("<p>Left out, as they have no weight: 4 records</p>"));
    EXPECT_NE(std::string::npos,
              RunOn(data, "equal-frequency", "--exclude w --format json").out.find("\"records_without_weight\": null"));
}

TEST_F(McbinWeights, WhatIsNoWeightIsAnErrorWithItsLineUnlessItIsDeclaredMissing)
{
    const std::string bad[][2] = {{"-0.5", "the weight '-0.5' is negative; --bad missing leaves such rows out"},
                                  {"-inf", "the weight '-inf' is negative; --bad missing leaves such rows out"},
                                  {"inf", "the weight 'inf' is infinite; --bad missing leaves such rows out"},
                                  {"nan", "'nan' is not a number; if it stands"}};
    for (const auto& [weight, words] : bad)
    {
        // Far enough in for a column to be believed to hold numbers alone.
        std::string data = "x,w\n";
        for (int i = 0; i < 1500; ++i) data += std::to_string(i) + ",1.5\n";
        data += "1500," + weight + "\n";
        const Outcome outcome = RunOn(data, "equal-frequency", "--weight w");
        EXPECT_EQ(1, outcome.exitCode) << weight;
        EXPECT_EQ(0u, outcome.err.find("mcbin: data.csv, line 1502: column 'w': " + words)) << outcome.err;
        EXPECT_EQ("", outcome.out);
        const Outcome left = RunOn(data, "equal-frequency", "--weight w --bad missing --format json");
        EXPECT_NE(std::string::npos, left.out.find("\"records_without_weight\": 1")) << left.out << left.err;
        EXPECT_NE(std::string::npos, left.out.find("\"weight_with_missing\": 2250,")) << left.out;
    }
}
