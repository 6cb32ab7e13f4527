#include "tests/hosts/mcbinrun.h"
#include "tests/hosts/mcbinterminal.h"

#include <string>
#include <vector>

// What the tool says beside its results, and how it shows texts that are not its own.

namespace
{

/// Sets the title of a terminal, changes its colour with the one-byte form of "ESC [", turns the direction of writing,
/// isolates a part of it, and ends both again, so that this file can be read.
const std::string kEvil = "a\x1b]0;title\x07\xC2\x9B"
                          "31m\u202E\u2066z\u2069\u202C";
constexpr const char* kShown = R"(a\x1b]0;title\x07\u009b31m\u202e\u2066z\u2069\u202c)";

using McbinMessages = Mcbin;
using McbinMessagesOnTerminal = McbinOnTerminal;

} // namespace

TEST_F(McbinMessagesOnTerminal, TextsOfOthersComeWithoutControlCharactersAndOverridesOfDirection)
{
    const std::string data = kEvil + ",y,\u202Dt\u202C\n1," + kEvil + ",\x1b[A\n2," + kEvil + ",\x1b[A\n3,b,\n4,b,\n";
    Write(kEvil, data);
    Write("bins.json", "{}");
    const std::string quoted = "'" + kEvil + "'";
    const std::vector<std::string> arguments{"supervised " + quoted + " --target y",
                                             "supervised " + quoted + " --target y --categorical " + quoted,
                                             "supervised " + quoted + " --target " + quoted + "x",
                                             "supervised " + quoted + " --target y --attributes '?t?,'" + quoted +
                                                 " --strict",
                                             "supervised " + quoted + " --target y --report " + quoted + "/page.html",
                                             "supervised " + quoted + " --target y --closed " + quoted,
                                             "supervised " + quoted + " --target y --" + quoted,
                                             "supervised " + quoted + " --target y --temp-dir " + quoted,
                                             "equal-frequency " + quoted + "x",
                                             "apply " + quoted + "x " + quoted,
                                             "apply " + quoted + " " + quoted,
                                             "apply bins.json data.csv -o " + quoted,
                                             quoted};
    for (const std::string& one : arguments)
    {
        Terminal terminal(fData.Path(), fTemporary.Path(), one, "NO_COLOR=1", 500);
        EXPECT_NE(-1, terminal.GetExitCode()) << one;
        for (const char* evil : {"\x1b]", "\x07", "\xC2\x9B", "\xE2\x80", "\xE2\x81", "\x1b[A"})
            EXPECT_EQ(std::string::npos, terminal.GetText().find(evil)) << one << '\n' << terminal.GetText();
    }
    Terminal terminal(fData.Path(), fTemporary.Path(), "supervised " + quoted + " --target y", "", 500);
    EXPECT_EQ(0, terminal.GetExitCode());
    EXPECT_NE(std::string::npos, terminal.GetText().find("binned 1 of 1: " + std::string(kShown)));
    EXPECT_NE(std::string::npos, terminal.GetText().find("\x1b[1m" + std::string(kShown) + " by y"));
}

TEST_F(McbinMessages, TablesShowTextsOfOthersInOneWayAndFormsForProgramsKeepThem)
{
    const std::string data = kEvil + ",y\n1,a\n2,a\n3,a\n4,b\n5,b\n6,b\n7,b\n";

    EXPECT_EQ(0u, RunOn(data, "supervised", "--target y").out.find(kShown));
    EXPECT_NE(std::string::npos, RunOn(data, "supervised", "--target y --format csv").out.find("\n" + kEvil + ",y,0,"));
    EXPECT_NE(std::string::npos, RunOn(data, "supervised", "--target y --format sql").out.find('"' + kEvil + '"'));
    EXPECT_EQ(0, Run("supervised data.csv --target y --format json >bins.json").exitCode);
    EXPECT_EQ(0u, Run("apply bins.json data.csv").out.find(kEvil + ",y," + kEvil + "_bin\n"));
}

TEST_F(McbinMessages, AllColumnsThatStopARunAreNamedAtOnceWithTheWayOut)
{
    std::string data = "id,ticket,price,name,n,y\n";
    for (int i = 0; i < 300; ++i)
    {
        data += "k" + std::to_string(i) + "," + (i == 7 ? "PC 17" : std::to_string(i)) + "," +
                (i % 3 == 0 ? "\"$1,200\"" : std::to_string(i)) + ",Ann," + std::to_string(i) +
                (i < 100 ? ",a\n" : ",b\n");
    }

    EXPECT_EQ(
        "mcbin: data.csv: 3 columns cannot be binned as they are: 'id' has more than 256 categories, 'ticket' has "
        "not only numbers ('PC 17' in line 9), 'price' has not only numbers ('$1,200' in line 2); --exclude leaves a "
        "column out, --categorical bins its fields as categories, --bad "
        "missing takes what is no number as missing, numbers are written as in 1234.5, without commas, $ and %\n",
        RunOn(data, "supervised", "--target y --categorical id --attributes '*,name'").err);
    EXPECT_EQ("mcbin: data.csv, line 258: column 'id': more than 256 categories, which are too many for a categorical "
              "attribute; --exclude leaves the column out\n",
              RunOn(data, "supervised", "--target y --categorical id --exclude ticket,price").err);
    EXPECT_EQ("", RunOn(data, "supervised", "--target y --exclude ticket,price").err);
    EXPECT_EQ(
        "mcbin: note: column 'price' has texts, which count as missing, but looks like numbers, such as '$1,200'; "
        "numbers are written as in 1234.5, without commas, $ and %\n",
        RunOn(data, "supervised", "--target y --exclude ticket --bad missing").err);
}

TEST_F(McbinMessages, ATextColumnThatLooksLikeNumbersGetsANote)
{
    const std::string note = "numbers are written as in 1234.5, without commas, $ and %\n";
    for (const char* field : {"\"1,200\"", "$5", "12 %", "\"-$1,234.50\""})
    {
        const std::string text = field;
        const Outcome outcome = RunOn("x,z\n1," + text + "\n2,none\n3," + text + "\n", "equal-frequency", "");
        EXPECT_EQ(0, outcome.exitCode);
        EXPECT_EQ(0u, outcome.err.find("mcbin: note: column 'z' is left out as text, but looks like numbers, such as "))
            << field << outcome.err;
        EXPECT_EQ(outcome.err.size() - note.size(), outcome.err.find(note)) << outcome.err;
    }
    EXPECT_EQ("", RunOn("x,z\n1,\"city, zip\"\n2,$\n3,$5\n", "equal-frequency", "").err);
    EXPECT_EQ("mcbin: data.csv, line 3: column 'x': '$1,200' is not a number: it has a $ and a comma, and numbers are "
              "written as in 1234.5, unless --decimal and --thousands say otherwise; --exclude leaves the column out, "
              "and --categorical bins its fields as categories\n",
              RunOn("x\n1\n\"$1,200\"\n3\n", "equal-frequency", "").err);
}

TEST_F(McbinMessages, WholeNumbersThatBecomeOneGetAWarning)
{
    const auto run = [&](const std::string& last)
    {
        // Behind a thousand numbers the first pass looks no further.
        std::string data = "id\n";
        for (int i = 1; i <= 1200; ++i) data += std::to_string(i) + "\n";
        const Outcome outcome = RunOn(data + last, "equal-frequency", "--bins 2");
        EXPECT_EQ(0, outcome.exitCode);
        return outcome.err;
    };

    EXPECT_EQ("mcbin: warning: column 'id': 9007199254740993 and 9007199254740992 count as one value, as whole numbers "
              "are told apart up to 2^53 only; --exclude leaves an identifier out\n",
              run("9007199254740993\n9007199254740992\n9007199254740992\n"));
    EXPECT_NE("", run("-9007199254740993\n-9007199254740992\n"));
    EXPECT_EQ("", run("9007199254740993\n-9007199254740993\n9007199254740991\n"));
    EXPECT_EQ("", run("9007199254740992\n+09007199254740992\n9007199254740994\n9007199254740992.0\n"));
}

TEST_F(McbinMessages, WeightsFarFromTheNumberOfRecordsGetANote)
{
    const std::string data = "x,w,v,y\n1,1,3,a\n2,2,2,a\n3,1,3,a\n4,2,2,b\n5,1,3,b\n6,2,0,b\n7,1,,b\n";

    EXPECT_EQ("", RunOn(data, "supervised", "--target y --weight w").err);
    EXPECT_EQ("mcbin: note: 5 records have weights that sum to 13, and the criterion takes a weight as a number of "
              "records, so it cuts more readily than 5 records would justify; where the weights are no such numbers, "
              "--weight-scale rows makes them sum to 5\n",
              RunOn(data, "supervised", "--target y --weight v").err);
    EXPECT_EQ("", RunOn(data, "equal-frequency", "--bins 2 --weight v").err);
    EXPECT_EQ("", RunOn("x,w,y\n1,1,a\n2,1,a\n3,.5,b\n4,.5,b\n5,1,b\n", "supervised", "--target y --weight w").err);
    EXPECT_NE(std::string::npos,
              RunOn("x,w,y\n1,1,a\n2,.1,a\n3,.1,b\n4,1,b\n5,.1,b\n", "supervised", "--target y --weight w")
                  .err.find("so it cuts less readily than 5 records would justify"));
}

TEST_F(McbinMessages, AMistypedCommandIsToldAsSuch)
{
    const std::string more = "\nRun 'mcbin --help' for more information.\n";
    for (const char* word : {"supervise", "superviced", "Supervised", "super"})
    {
        EXPECT_EQ("mcbin: no such command: '" + std::string(word) + "'; did you mean 'supervised'?" + more,
                  Run(std::string(word) + " data.csv --target y").err);
    }
    EXPECT_NE(std::string::npos, Run("equal_frequency data.csv").err.find("did you mean 'equal-frequency'?"));
    EXPECT_NE(std::string::npos, Run("aplly b.json data.csv").err.find("did you mean 'apply'?"));
    EXPECT_EQ("mcbin: no such command: 'data.csv'; there are supervised, equal-frequency, show, evaluate, apply" + more,
              Run("data.csv").err);
}

TEST_F(McbinMessages, TheHelpTellsTheLimitOfCategoriesAndANumericTargetWorksAsItShows)
{
    std::string data = "size,price\n";
    for (int i = 0; i < 400; ++i) data += std::to_string(i / 4) + "," + std::to_string(1000 + i) + "\n";
    Write("cars.csv", data);

    EXPECT_NE(std::string::npos, Run("supervised --help").out.find("from 2 to 256"));
    const Outcome outcome = Shell("eval \"$(mcbin supervised --help | grep cars.csv)\"");

    EXPECT_EQ(0, outcome.exitCode) << outcome.err;
    EXPECT_EQ(0u, outcome.out.find("size by price_bin: gain 2.0000 bits, 100.0%\n")) << outcome.out << outcome.err;
}
