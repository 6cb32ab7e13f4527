#include "hosts/mcbinrun.h"
#include "hosts/mcbinterminal.h"

#include <string>
#include <vector>

// What the tool says beside its results, and how it shows texts that are not its own.

namespace
{

/// Sets the title of a terminal, changes its colour with the one-byte form of "ESC [", turns the direction of writing,
/// and isolates a part of it.
const std::string kEvil = "a\x1b]0;title\x07\xC2\x9B"
                          "31m\u202E\u2066z";
constexpr const char* kShown = R"(a\x1b]0;title\x07\u009b31m\u202e\u2066z)";

using McbinMessages = Mcbin;
using McbinMessagesOnTerminal = McbinOnTerminal;

} // namespace

TEST_F(McbinMessagesOnTerminal, TextsOfOthersComeWithoutControlCharactersAndOverridesOfDirection)
{
    const std::string data = kEvil + ",y,\u202Dt\n1," + kEvil + ",\x1b[A\n2," + kEvil + ",\x1b[A\n3,b,\n4,b,\n";
    Write(kEvil, data);
    Write("bins.json", "{}");
    const std::string quoted = "'" + kEvil + "'";
    const std::vector<std::string> arguments{"supervised " + quoted + " --target y",
                                             "supervised " + quoted + " --target y --categorical " + quoted,
                                             "supervised " + quoted + " --target " + quoted + "x",
                                             "supervised " + quoted + " --target y --attributes '?t,'" + quoted +
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
        for (const char* evil : {"\x1b]", "\x07", "\xC2\x9B", "\u202E", "\u2066", "\u202D", "\x1b[A"})
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
