#include "support/tempdir.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <array>
#include <cstdlib>
#include <fstream>
#include <sstream>
#include <string>
#include <vector>

#include <sys/wait.h>
#include <unistd.h>

// The program is run as its user would, through a shell; MCBIN_PATH and EXAMPLE_DATA come from the build.

namespace
{

struct Outcome
{
    int exitCode;
    std::string out;
    std::string err;
};

std::string ReadFile(const std::string& path)
{
    std::ostringstream text;
    text << std::ifstream(path, std::ios::binary).rdbuf();
    return text.str();
}

/// Runs the program in a directory with the data; what it has left of temporary files is a fault.
class Mcbin : public testing::Test
{
protected:
    void TearDown() override { EXPECT_TRUE(fTemporary.IsEmpty()); }

    /// `arguments` are those of a shell.
    Outcome Run(const std::string& arguments) const
    {
        const std::string command = "cd " + fData.Path() + " && { TMPDIR=" + fTemporary.Path() + " '" MCBIN_PATH "' " +
                                    arguments + "; } >out 2>err";
        const int status = std::system(command.c_str());
        return {WIFEXITED(status) ? WEXITSTATUS(status) : -1, ReadFile(fData.File("out")), ReadFile(fData.File("err"))};
    }

    /// Runs on data.csv with these contents.
    Outcome RunOn(const std::string& data, const std::string& command, const std::string& options) const
    {
        std::ofstream(fData.File("data.csv"), std::ios::binary) << data;
        return Run(command + " data.csv " + options);
    }

    TempDir fData;
    TempDir fTemporary;
};

constexpr const char* kHeights = "height,\"city, zip\",size,flat,void\n"
                                 "1.5,\"A, \"\"0\"\"\",small,7,\n"
                                 "2, B ,small,7,\n"
                                 "2.5,B,small,7,\n"
                                 "3,B,small,,\n"
                                 "1.1e1,B,\"größer\",7,\n"
                                 "+12,B,größer,7,\n"
                                 "13,B,größer,7,\n"
                                 "14,B,größer,7,\n"
                                 "\n"
                                 ",C,small,7,\n"
                                 "12,C,,7,\n";

constexpr const char* kHeightsBySize = R"(height by size
  bin        weight  größer  small
  (-inf, 3]       4       0      4
  (3, +inf)       4       4      0
  distinct values 8, missing weight 2, minimum 1.5, maximum 14, model entropy 0

flat by size
  bin           weight  größer  small
  (-inf, +inf)       8       4      4
  warning 120014: all valid values are equal
  distinct values 1, missing weight 2, minimum 7, maximum 7, model entropy 1

void by size
  warning 120015: no record has a valid value
  distinct values 0, missing weight 10, minimum none, maximum none, model entropy none

Left out, as not all fields are numbers: city, zip ('A, "0"' in line 2)
)";

std::string Replace(std::string text, const std::string& what, const std::string& with)
{
    for (std::size_t at = 0; (at = text.find(what, at)) != std::string::npos; at += with.size())
        text.replace(at, what.size(), with);
    return text;
}

} // namespace

TEST_F(Mcbin, SupervisedPrintsBinsFiguresWarningsAndWhatIsLeftOut)
{
    const Outcome outcome = RunOn(kHeights, "supervised", "--target size");

    EXPECT_EQ(0, outcome.exitCode);
    EXPECT_EQ("", outcome.err);
    EXPECT_EQ(kHeightsBySize, outcome.out);
}

TEST_F(Mcbin, LineEndsAndAUtf8MarkMakeNoDifference)
{
    const std::string heights = kHeights;
    const std::vector<std::string> variants{Replace(heights, "\n", "\r\n"), Replace(heights, "\n", "\r"),
                                            heights.substr(0, heights.size() - 1), "\xEF\xBB\xBF" + heights};
    for (const std::string& variant : variants)
        EXPECT_EQ(kHeightsBySize, RunOn(variant, "supervised", "--target size").out) << variant;
}

TEST_F(Mcbin, OrderOfRowsMakesNoDifference)
{
    const std::string iris = "'" EXAMPLE_DATA "/iris.csv'";
    const std::string otherOrder = "{ head -n 1 " + iris + "; tail -n +2 " + iris + " | sort -r; } >";
    ASSERT_EQ(0, std::system((otherOrder + fData.File("sorted.csv")).c_str()));

    const Outcome outcome = Run("supervised " + iris + " --target species");

    EXPECT_NE(std::string::npos, outcome.out.find("  (-inf, 1.9]      50      50           0          0\n"
                                                  "  (1.9, 4.7]       45       0          44          1\n"
                                                  "  (4.7, +inf)      55       0           6         49\n"));
    EXPECT_EQ(outcome.out, Run("supervised sorted.csv --target species").out);
}

TEST_F(Mcbin, EqualFrequencyBinsEveryNumericColumn)
{
    const Outcome outcome = RunOn("x,y\n1,a\n2,b\n3,a\n0.1,b\n,a\n", "equal-frequency", "--bins 2");

    EXPECT_EQ(0, outcome.exitCode);
    EXPECT_EQ("x\n"
              "  bin          weight\n"
              "  (-inf, 1.5]       2\n"
              "  (1.5, +inf)       2\n"
              "  distinct values 4, missing weight 1, minimum 0.1, maximum 3\n"
              "\n"
              "Left out, as not all fields are numbers: y ('a' in line 2)\n",
              outcome.out);
}

TEST_F(Mcbin, AFileOfManyBlocksLosesNoRowAndNoLine)
{
    std::string data = "x,padding\n";
    for (int i = 1; i <= 50000; ++i)
        data += std::to_string(i) + ",\"" + std::string(static_cast<std::size_t>(i % 7), '\n') + "\"\n";

    const Outcome whole = RunOn(data, "equal-frequency", "--bins 2");
    const Outcome broken = RunOn(data + "1,2,3\n", "equal-frequency", "--bins 2");

    EXPECT_NE(std::string::npos, whole.out.find("distinct values 50000, missing weight 0, minimum 1, maximum 50000"));
    const long line = std::count(data.begin(), data.end(), '\n') + 1;
    EXPECT_EQ("mcbin: data.csv, line " + std::to_string(line) + ": wrong number of fields: 3, but the header has 2\n",
              broken.err);
}

TEST_F(Mcbin, BadInputFailsInWordsThatNameThePlace)
{
    struct Case
    {
        const char* data;
        const char* err;
    };
    const Case cases[] = {
        {"", ": the file is empty; its first line should name the columns"},
        {"x,y\n", ": there is no row below the header"},
        {"x,z\n1,2\n", ": no column is named 'y'; there are 'x', 'z'"},
        {"x,y,x\n1,2,3\n", ", line 1: two columns are named 'x'"},
        {"x,y\n\"1\n\",a\n\n2\n", ", line 5: wrong number of fields: 1, but the header has 2"},
        {"x,y\n1,a\n2,\"b\n3,c\n", ", line 3: a quoted field in this row is never closed"},
        {"x,y\n1,a,b\n2,5\" disk\n", ", line 2: wrong number of fields: 3, but the header has 2"},
        {"x,y\n1,a\n2,5\" disk\n", ", line 3: a quote in the wrong place: a field that holds one must be quoted, and "
                                   "the quote in it doubled"},
    };
    for (const Case& c : cases)
    {
        const Outcome outcome = RunOn(c.data, "supervised", "--target y");
        EXPECT_EQ(1, outcome.exitCode) << c.data;
        EXPECT_EQ("", outcome.out) << c.data;
        EXPECT_EQ("mcbin: data.csv" + std::string(c.err) + "\n", outcome.err) << c.data;
    }
    EXPECT_EQ("mcbin: none.csv: No such file or directory\n", Run("supervised none.csv --target y").err);
    EXPECT_EQ(1, Run("supervised . --target y").exitCode);
}

TEST_F(Mcbin, ATargetHasFrom2To256Categories)
{
    std::string data = "x,y\n";
    for (int i = 1; i <= 256; ++i) data += std::to_string(i) + "," + std::to_string(i) + "\n";

    EXPECT_EQ(0, RunOn(data, "supervised", "--target y").exitCode);
    EXPECT_EQ("mcbin: data.csv, line 258: column 'y' has more than 256 categories, which are too many for a target\n",
              RunOn(data + "1,257\n", "supervised", "--target y").err);
    EXPECT_EQ("mcbin: column 'y' has a single category, '3'; a target needs at least 2\n",
              RunOn("x,y\n1,3\n2,\n", "supervised", "--target y").err);
}

TEST_F(Mcbin, BadArgumentsAreAUsageError)
{
    for (const char* arguments : {"", "guess data.csv", "supervised data.csv", "supervised --target y",
                                  "equal-frequency data.csv", "equal-frequency data.csv --bins 1",
                                  "equal-frequency data.csv --bins many", "supervised data.csv more --target y"})
    {
        const Outcome outcome = Run(arguments);
        EXPECT_EQ(2, outcome.exitCode) << arguments;
        EXPECT_EQ("", outcome.out) << arguments;
        EXPECT_EQ(0u, outcome.err.find("mcbin: ")) << outcome.err;
    }
    EXPECT_EQ(0, Run("supervised --help").exitCode);
}

TEST_F(Mcbin, ResultsThatCannotBeWrittenAreAFailure)
{
    const std::string iris = "equal-frequency '" EXAMPLE_DATA "/iris.csv' --bins 4";
    EXPECT_EQ(1, Run(iris + " >/dev/full").exitCode);

    std::array<int, 2> ends{};
    ASSERT_EQ(0, pipe(ends.data()));
    close(ends[0]);
    const Outcome closedPipe = Run(iris + " >&" + std::to_string(ends[1]));
    close(ends[1]);
    EXPECT_EQ(1, closedPipe.exitCode);
    EXPECT_EQ("mcbin: cannot write the results to standard output\n", closedPipe.err);
}
