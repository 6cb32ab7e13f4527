#include "tests/hosts/mcbinrun.h"

#include <map>
#include <random>
#include <vector>

// An infinity is the value beyond all others of its sign. It costs a column nothing, and comes out as it went in.

namespace
{

class McbinInfinities : public Mcbin
{
protected:
    /// Of the one attribute: its bins by row of data.csv, as apply gives them.
    std::vector<std::string> Apply() const
    {
        const Outcome outcome = Run("apply bins.json data.csv --in-place-columns | sed 1d | cut -d, -f1");
        EXPECT_EQ(0, outcome.exitCode) << outcome.err;
        std::istringstream lines(outcome.out);
        std::vector<std::string> bins;
        for (std::string line; std::getline(lines, line);) bins.push_back(line);
        return bins;
    }
};

} // namespace

TEST_F(McbinInfinities, OneCostsAColumnNothing)
{
    std::string data = "x,y\n";
    for (int i = 1; i <= 1000; ++i) data += std::to_string(i) + (i <= 300 ? ",a\n" : i <= 600 ? ",b\n" : ",c\n");
    for (const std::string closed : {"right", "left"})
    {
        const std::string options = "--target y --format json --closed " + closed + " | grep cut_points";
        const std::string cuts = RunOn(data, "supervised", options).out;
        ASSERT_NE(std::string::npos, cuts.find(closed == "right" ? "[300, 600]" : "[301, 601]"));
        EXPECT_EQ(cuts, RunOn(data + "inf,c\n", "supervised", options).out) << closed;
        EXPECT_EQ(cuts, RunOn(data + "-Infinity,a\n", "supervised", options).out) << closed;
    }
    const Outcome table = RunOn(data + "+INF,c\n-inf,a\n", "supervised", "--target y");
    EXPECT_NE(std::string::npos, table.out.find("1002 distinct values from -inf to inf, missing weight 0"));
    EXPECT_NE(std::string::npos, table.out.find("(-inf, 300]     301"));
    EXPECT_NE(std::string::npos, table.out.find("(600, +inf)     401"));
}

TEST_F(McbinInfinities, OneThatIsACutPointHasABinForItself)
{
    struct Case
    {
        const char* closed;
        const char* infinity;
        const char* cutPoints;
        const char* rows; ///< of the CSV, up to the closed side
        const char* condition;
    };
    const Case cases[] = {
        {"right", "-inf", "[\"-inf\"]",
         "x,y,0,\"[-inf, -inf]\",-inf,-inf,right\nx,y,1,\"(-inf, +inf)\",-inf,inf,right\n",
         "\"x\" < -1.7976931348623157e+308"},
        {"left", "inf", "[\"inf\"]", "x,y,0,\"(-inf, +inf)\",-inf,inf,left\nx,y,1,\"[+inf, +inf]\",inf,inf,left\n",
         "\"x\" <= 1.7976931348623157e+308"},
        {"left", "-inf", "[1]", "x,y,0,\"(-inf, 1)\",-inf,1,left\nx,y,1,\"[1, +inf)\",1,inf,left\n", "\"x\" < 1"},
        {"right", "inf", "[9]", "x,y,0,\"(-inf, 9]\",-inf,9,right\nx,y,1,\"(9, +inf)\",9,inf,right\n", "\"x\" <= 9"},
    };
    for (const Case& c : cases)
    {
        std::string data = "x,y\n";
        for (int i = 1; i <= 9; ++i) data += std::to_string(i) + ",finite\n" + c.infinity + ",infinite\n";
        const std::string options = std::string("--target y --closed ") + c.closed;
        ASSERT_EQ(0, RunOn(data, "supervised", options + " --format json > bins.json").exitCode);

        EXPECT_NE(std::string::npos,
                  ReadFile(fData.File("bins.json")).find("\"cut_points\": " + std::string(c.cutPoints)));
        EXPECT_EQ(c.rows, RunOn(data, "supervised", options + " --format csv | sed 1d | sed '$d' | cut -d, -f1-8").out);
        EXPECT_NE(
            std::string::npos,
            RunOn(data, "supervised", options + " --format sql").out.find("WHEN " + std::string(c.condition) + " T"));
        const std::vector<std::string> bins = Apply();
        const bool isFirst = c.infinity[0] == '-';
        for (std::size_t i = 0; i < 18; ++i) EXPECT_EQ((i % 2 == 1) == isFirst ? "0" : "1", bins.at(i)) << i;
    }
}

TEST_F(McbinInfinities, BinsOfEqualWeightPartThemFromTheLastNumber)
{
    // Five targets of 20 each: the last is met exactly between 80 and the infinities.
    std::string data = "x\n";
    for (int i = 1; i <= 80; ++i) data += std::to_string(i) + "\n";
    for (int i = 0; i < 20; ++i) data += "inf\n";
    const auto labels = [&](const std::string& closed)
    {
        return RunOn(data, "equal-frequency",
                     "--bins 5 --format csv --closed " + closed + " | tail -n 2 | head -n 1 | cut -d, -f4-9")
            .out;
    };

    EXPECT_EQ("\"(80, +inf)\",80,inf,right,20\n", labels("right"));
    EXPECT_EQ("\"[+inf, +inf]\",inf,inf,left,20\n", labels("left"));
}

TEST_F(McbinInfinities, TheBinsHoldWhatTheirCutPointsSay)
{
    const unsigned int seed = std::random_device()();
    SCOPED_TRACE(seed);
    std::mt19937 random(seed);
    const std::vector<std::string> values{"-inf",
                                          "-1.7976931348623157e308",
                                          "-1.7976931348623155e308",
                                          "-9e307",
                                          "-1",
                                          "0",
                                          "2",
                                          "3",
                                          "1.7976931348623153e308",
                                          "1.7976931348623155e308",
                                          "1.7976931348623157e308",
                                          "inf"};
    for (int round = 0; round < 12; ++round)
    {
        std::string data = "x,y\n";
        const std::size_t border = random() % values.size();
        for (int i = 0; i < 60; ++i)
        {
            const std::size_t value = random() % values.size();
            data += values[value] + (random() % 9 == 0 || value < border ? ",a\n" : ",b\n");
        }
        for (const std::string options : {"supervised:--target y --closed left", "supervised:--target y --closed right",
                                          "supervised:--target y --closed left --distinct-threshold 2 --bins 5",
                                          "equal-frequency:--exclude y --bins 5 --closed left",
                                          "equal-frequency:--exclude y --bins 4 --closed right"})
        {
            const std::string method = options.substr(0, options.find(':'));
            const std::string settings = options.substr(options.find(':') + 1);
            RunOn(data, method, settings + " --format json > bins.json");
            const std::string json = ReadFile(fData.File("bins.json"));
            if (json.find("\"cut_points\": []") != std::string::npos)
                continue;
            std::map<std::string, int> counts;
            for (const std::string& bin : Apply()) ++counts[bin];
            std::string expected;
            for (const auto& [bin, count] : counts) expected += std::to_string(count) + "\n";
            EXPECT_EQ(expected, Shell("sed -n 's/.*\"right\": .*\"weight\": \\([0-9]*\\),.*/\\1/p' bins.json").out)
                << options << "\n"
                << json << data;
        }
    }
}

TEST_F(McbinInfinities, CanBeDeclaredMissing)
{
    const std::string data = "x\n1\n2\ninf\n-inf\n";
    const auto range = [&](const std::string& missing)
    { return RunOn(data, "equal-frequency", "--bins 2 --missing x=" + missing + " | sed -n 2p").out; };

    EXPECT_EQ("  3 distinct values from -inf to 2, missing weight 1\n", range("inf"));
    EXPECT_EQ("  2 distinct values from -inf to 1, missing weight 2\n", range("2:"));
    const Outcome sql = RunOn(data, "equal-frequency", "--bins 2 --missing x=inf,-inf,7 --format sql");
    EXPECT_NE(std::string::npos,
              sql.out.find("WHEN \"x\" IS NULL OR \"x\" IN (7) OR \"x\" > 1.7976931348623157e+308 OR \"x\" < "
                           "-1.7976931348623157e+308 THEN NULL"))
        << sql.out;
    RunOn(data, "equal-frequency", "--bins 2 --missing x=inf --format json > bins.json");
    // In a row of one field an empty one is quoted, since a blank line is no row.
    EXPECT_EQ((std::vector<std::string>{"0", "1", "\"\"", "0"}), std::vector<std::string>(Apply()));
}
