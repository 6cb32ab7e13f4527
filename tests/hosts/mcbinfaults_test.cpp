#include "hosts/mcbinrun.h"

#include <array>
#include <csignal>
#include <string>

#include <pty.h>
#include <unistd.h>

// What can go wrong around the tool: nothing is lost, and nothing stays behind.

namespace
{

std::string MakeTable(int rows, int columns)
{
    std::string data = "y";
    for (int i = 0; i < columns; ++i) data += ",x" + std::to_string(i);
    data += "\n";
    for (int row = 0; row < rows; ++row)
    {
        data += row < rows / 3 ? "a" : "b";
        for (int i = 0; i < columns; ++i) data += "," + std::to_string(row + (row * 7919) % (i + 13));
        data += "\n";
    }
    return data;
}

/// A program on a terminal of its own.
class Terminal
{
public:
    Terminal(const std::string& directory, const std::string& temporary, const std::string& arguments)
    {
        winsize size = {};
        size.ws_row = 24;
        size.ws_col = 100;
        fProcess = forkpty(&fMaster, nullptr, nullptr, &size);
        if (fProcess == 0)
        {
            setenv("TMPDIR", temporary.c_str(), 1);
            setenv("TERM", "xterm", 1);
            unsetenv("NO_COLOR");
            const std::string script = "cd " + directory + " && exec '" MCBIN_PATH "' " + arguments;
            execl("/bin/sh", "sh", "-c", script.c_str(), nullptr);
            _exit(127);
        }
    }
    Terminal(const Terminal&) = delete;
    Terminal& operator=(const Terminal&) = delete;
    ~Terminal() { close(fMaster); }

    /// Reads until the text has come, or to the end of the program. \return whether it has come.
    bool WaitFor(const std::string& text)
    {
        std::array<char, 4096> block;
        while (fText.find(text) == std::string::npos)
        {
            const ssize_t size = read(fMaster, block.data(), block.size());
            if (size <= 0)
                return false;
            fText.append(block.data(), static_cast<std::size_t>(size));
        }
        return true;
    }

    /// As the key does.
    void PressCtrlC() const { EXPECT_EQ(1, write(fMaster, "\x03", 1)); }

    int GetExitCode()
    {
        WaitFor("\xFF"); // never comes
        int status = 0;
        waitpid(fProcess, &status, 0);
        return WIFEXITED(status) ? WEXITSTATUS(status) : -1;
    }

    const std::string& GetText() const { return fText; }

private:
    int fMaster = -1;
    pid_t fProcess = -1;
    std::string fText;
};

using McbinFaults = Mcbin;

constexpr const char* kIris = "'" EXAMPLE_DATA "/iris.csv'";

} // namespace

TEST_F(McbinFaults, BadArgumentsAreAUsageError)
{
    for (const char* arguments :
         {"", "guess data.csv", "supervised data.csv", "supervised --target y", "equal-frequency data.csv --bins 1",
          "equal-frequency data.csv --bins many", "supervised data.csv more --target y",
          "supervised data.csv --target y --pairs x:y", "supervised data.csv --target y --closed both",
          "supervised data.csv --target y --small-bins 2", "equal-frequency data.csv --delimiter ab",
          "apply bins.json"})
    {
        const Outcome outcome = Run(arguments);
        EXPECT_EQ(2, outcome.exitCode) << arguments;
        EXPECT_EQ("", outcome.out) << arguments;
        EXPECT_EQ(0u, outcome.err.find("mcbin: ")) << outcome.err;
    }
}

TEST_F(McbinFaults, StrictTellsOfAWarningByItsExitCode)
{
    const std::string data = "x,flat,y\n1,1,a\n2,1,a\n3,1,b\n4,1,b\n";

    EXPECT_EQ(0, RunOn(data, "equal-frequency", "--bins 2").exitCode);
    EXPECT_EQ(0, RunOn(data, "equal-frequency", "--bins 2 --strict --exclude flat").exitCode);
    EXPECT_EQ(3, RunOn(data, "equal-frequency", "--bins 2 --strict").exitCode);
}

TEST_F(McbinFaults, WhatCannotBeWrittenIsAFailureAndLeavesNothing)
{
    Write("data.csv", MakeTable(20000, 3));
    ASSERT_EQ(0, Run("supervised data.csv --target y --format json >bins.json").exitCode);
    const std::size_t numFiles = fData.FileNames().size();

    EXPECT_EQ("mcbin: cannot write standard output: No space left on device\n",
              Run(std::string("equal-frequency ") + kIris + " >/dev/full").err);
    EXPECT_EQ("mcbin: cannot write standard output: No space left on device\n",
              Run("apply bins.json data.csv >/dev/full").err);
    EXPECT_EQ(1, Shell("(ulimit -f 64; mcbin apply bins.json data.csv -o out.csv)").exitCode);
    EXPECT_EQ(1, Run("supervised data.csv --target y --report none/page.html").exitCode);
    const Outcome noRoom = Shell("(ulimit -f 64; mcbin supervised data.csv --target y)");
    EXPECT_EQ(1, noRoom.exitCode);
    EXPECT_EQ("mcbin: error 120021: a temporary file cannot be opened, written or read; the disk may be full\n",
              noRoom.err);
    EXPECT_EQ(1, Shell("(ulimit -f 64; cat data.csv | mcbin supervised - --target y)").exitCode);
    EXPECT_EQ(numFiles, fData.FileNames().size());
}

TEST_F(McbinFaults, ADirectoryThatTakesNoFilesIsAFailureInWords)
{
    // Even root makes no file in /proc.
    for (const char* directory : {"/proc", "nowhere"})
    {
        const std::string options = std::string(" --target species --temp-dir ") + directory;
        const Outcome outcome = Run(std::string("supervised ") + kIris + options);
        EXPECT_EQ(1, outcome.exitCode);
        EXPECT_EQ(0u, outcome.err.find("mcbin: error 1200")) << outcome.err;
        const Outcome piped = Shell(std::string("cat ") + kIris + " | mcbin supervised -" + options);
        EXPECT_EQ(1, piped.exitCode);
        EXPECT_EQ("mcbin: cannot make a temporary file in " + std::string(directory) + ": No such file or directory\n",
                  piped.err);
    }
}

TEST_F(McbinFaults, AClosedPipeEndsTheToolWithoutAWord)
{
    Write("data.csv", MakeTable(20000, 3));
    Run("supervised data.csv --target y --format json >bins.json");

    const Outcome outcome = Shell("{ mcbin apply bins.json data.csv; echo $? >code; } | head -n 2");

    EXPECT_EQ("1\n", ReadFile(fData.File("code")));
    EXPECT_EQ("", outcome.err);
}

TEST_F(McbinFaults, BinsThatDontFitTheDataAreAFailureInWords)
{
    ASSERT_EQ(0, RunOn("x,g,y\n1,a,0\n2,a,0\n3,a,0\n4,b,1\n5,b,1\n6,b,1\n7,b,1\n", "supervised",
                       "--target y --categorical g --format json >bins.json")
                     .exitCode);
    Write("cut.json", "{\"schema\": ");
    Write("other.json", "{\"schema\": \"something\"}");

    EXPECT_NE(std::string::npos, RunOn("x\n1\n", "apply bins.json", "").err.find("no column is named 'g'"));
    EXPECT_NE(std::string::npos,
              RunOn("x,g\n1,a\nten,a\n", "apply bins.json", "").err.find("line 3: column 'x': 'ten' is not a number"));
    EXPECT_NE(std::string::npos, RunOn("x,g\n1,c\n", "apply bins.json", "")
                                     .err.find("line 2: column 'g': 'c' is a category that the bins don't know"));
    EXPECT_EQ("x,g,x_bin,g_bin\nten,c,,\n-5,a,0,0\n",
              RunOn("x,g\nten,c\n-5,a\n", "apply bins.json", "--bad missing").out);
    EXPECT_EQ("g,x,id\n{b},\"(3, +inf)\",\"a,b\"\n",
              RunOn("g,x,id\nb,1e9,\"a,b\"\n", "apply bins.json", "--labels --in-place-columns").out);
    EXPECT_NE(std::string::npos, RunOn("x,g,x_bin\n1,a,1\n", "apply bins.json", "").err.find("already"));
    for (const char* bins : {"cut.json", "other.json", "none.json", "data.csv"})
    {
        const Outcome outcome = Run(std::string("apply ") + bins + " data.csv");
        EXPECT_EQ(1, outcome.exitCode) << bins;
        EXPECT_EQ("mcbin: " + std::string(bins) + ": ", outcome.err.substr(0, 9 + std::string(bins).size()));
    }
}

TEST_F(McbinFaults, CtrlCAmongTheAttributesPrintsWhatWasFound)
{
    Write("data.csv", MakeTable(100000, 12));

    Terminal terminal(fData.Path(), fTemporary.Path(), "supervised data.csv --target y --format csv");
    ASSERT_TRUE(terminal.WaitFor("binned 1 of 12: x0")) << terminal.GetText();
    terminal.PressCtrlC();

    EXPECT_EQ(130, terminal.GetExitCode());
    EXPECT_NE(std::string::npos, terminal.GetText().find("x0,y,0,")) << terminal.GetText();
    EXPECT_EQ(std::string::npos, terminal.GetText().find("x11,y,0,"));
    EXPECT_NE(std::string::npos, terminal.GetText().find("mcbin: interrupted; these are the results up to then"));
}

TEST_F(McbinFaults, CtrlCInAPassEndsItWithoutResults)
{
    Write("data.csv", MakeTable(200000, 6));

    for (const char* phase : {"learning the columns: 65536 rows", "reading the records: 50000 rows"})
    {
        Terminal terminal(fData.Path(), fTemporary.Path(), "supervised data.csv --target y");
        ASSERT_TRUE(terminal.WaitFor(phase)) << terminal.GetText();
        terminal.PressCtrlC();

        EXPECT_EQ(130, terminal.GetExitCode());
        EXPECT_NE(std::string::npos, terminal.GetText().find("mcbin: interrupted; there are no results yet"));
    }
}

TEST_F(McbinFaults, OnATerminalTablesAreColouredAndAsWideAsIt)
{
    Terminal terminal(fData.Path(), fTemporary.Path(), std::string("supervised ") + kIris + " --target species");

    EXPECT_EQ(0, terminal.GetExitCode());
    EXPECT_NE(std::string::npos, terminal.GetText().find("\x1b[1mpetal_width by species\x1b[0m: gain 1.3784 bits"));
    EXPECT_NE(std::string::npos, terminal.GetText().find("\x1b[34m█"));
}
