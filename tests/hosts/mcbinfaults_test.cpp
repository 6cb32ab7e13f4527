#include "tests/hosts/mcbinrun.h"
#include "tests/hosts/mcbinterminal.h"

#include <array>
#include <chrono>
#include <csignal>
#include <filesystem>
#include <fstream>
#include <functional>
#include <optional>
#include <string>
#include <vector>

#include <fcntl.h>
#include <sched.h>
#include <sys/ioctl.h>
#include <sys/wait.h>
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

/// The program with a pipe for its standard output and standard error. Its input must fill the pipe.
class Piped
{
public:
    Piped(const std::string& directory, const std::vector<std::string>& arguments)
    {
        EXPECT_EQ(0, pipe(fPipe.data()));
        fProcess = fork();
        if (fProcess == 0)
        {
            alarm(kLongestRun);
            std::vector<const char*> words{MCBIN_PATH};
            for (const std::string& argument : arguments) words.push_back(argument.c_str());
            words.push_back(nullptr);
            dup2(fPipe[1], STDOUT_FILENO);
            dup2(fPipe[1], STDERR_FILENO);
            if (chdir(directory.c_str()) == 0)
                execv(MCBIN_PATH, const_cast<char**>(words.data()));
            _exit(127);
        }
        close(fPipe[1]);
        const auto limit = std::chrono::steady_clock::now() + std::chrono::seconds(kLongestRun);
        while (CountWaiting() < fcntl(fPipe[0], F_GETPIPE_SZ) && std::chrono::steady_clock::now() < limit)
            sched_yield();
    }
    Piped(const Piped&) = delete;
    Piped& operator=(const Piped&) = delete;
    ~Piped() { close(fPipe[0]); }

    void Interrupt() const { EXPECT_EQ(0, kill(fProcess, SIGINT)); }

    /// Reads to the end of the program.
    std::string ReadAll() const
    {
        std::string text;
        std::array<char, 4096> block;
        for (ssize_t size; (size = read(fPipe[0], block.data(), block.size())) > 0;)
            text.append(block.data(), static_cast<std::size_t>(size));
        return text;
    }

    /// \return whether it has ended, and then the status of its end.
    std::optional<int> FindEnd(int options) const
    {
        int status = 0;
        return waitpid(fProcess, &status, options) == fProcess ? std::optional(status) : std::nullopt;
    }

private:
    int CountWaiting() const
    {
        int size = 0;
        ioctl(fPipe[0], FIONREAD, &size);
        return size;
    }

    std::array<int, 2> fPipe{};
    pid_t fProcess = -1;
};

using McbinFaults = Mcbin;
using McbinFaultsOnTerminal = McbinOnTerminal;

constexpr const char* kIris = "'" EXAMPLE_DATA "/iris.csv'";

} // namespace

TEST_F(McbinFaults, BadArgumentsAreAUsageError)
{
    for (const char* arguments :
         {"", "guess data.csv", "supervised data.csv", "supervised --target y", "equal-frequency data.csv --bins 1",
          "equal-frequency data.csv --bins many", "supervised data.csv more --target y",
          "supervised data.csv --target y --pairs x:y", "supervised data.csv --target y --closed both",
          "supervised data.csv --target y --small-bins 2", "supervised data.csv --target y --small-bins nan",
          "equal-frequency data.csv --delimiter ab", "equal-frequency data.csv --report -", "apply bins.json"})
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
    EXPECT_EQ(1, Run("--help >/dev/full").exitCode);
    const Outcome noPage = Run("supervised data.csv --target y --report none/page.html");
    EXPECT_EQ("mcbin: cannot write none/page.html: No such file or directory\n", noPage.err);
    EXPECT_EQ("", noPage.out) << "found out before the work";
    const Outcome fullPage = Run("supervised data.csv --target y --report /dev/full");
    EXPECT_EQ("mcbin: cannot write /dev/full: No space left on device\n", fullPage.err);
    EXPECT_EQ(Run("supervised data.csv --target y").out, fullPage.out) << "the tables are not lost";
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

TEST_F(McbinFaults, ATmpdirThatCannotBeUsedIsRefusedUnlessADirectoryIsNamed)
{
    Write("data.csv", "x,y\n1,a\n2,a\n3,b\n4,b\n");
    Write("file", "");
    for (const char* command : {"supervised data.csv --target y", "equal-frequency data.csv"})
    {
        for (const char* directory : {"nowhere", "file", "file/below"})
        {
            const std::string call = "export TMPDIR=" + std::string(directory) + "; mcbin " + command;
            const Outcome refused = Shell(call);
            EXPECT_EQ(2, refused.exitCode);
            EXPECT_EQ("", refused.out);
            EXPECT_EQ("mcbin: TMPDIR is " + std::string(directory) +
                          ", which is no directory that files can be made in; set it to one, unset it, or give "
                          "--temp-dir\nRun 'mcbin --help' for more information.\n",
                      refused.err);
            EXPECT_EQ(0, Shell(call + " --temp-dir .").exitCode);
            EXPECT_EQ(0, Shell(call + " --help").exitCode);
        }
        EXPECT_EQ(0, Shell(std::string("export TMPDIR=$PWD//; mcbin ") + command).exitCode);
    }
    EXPECT_EQ(4u, fData.FileNames().size()) << "data.csv, file, out and err";
}

TEST_F(McbinFaults, ADirectoryThatMayOnlyBeReadIsAFailureInWords)
{
    const std::string locked = fData.File("locked");
    std::filesystem::create_directory(locked);
    chmod(locked.c_str(), 0555);
    Write("data.csv", "x,y\n1,a\n2,a\n3,b\n4,b\n");
    Run("supervised data.csv --target y --format json >bins.json");
    // Root may write everywhere, unless that is taken away.
    const std::string lead =
        std::string(geteuid() == 0 ? "setpriv --bounding-set -dac_override " : "") + "'" MCBIN_PATH "'";
    struct Case
    {
        const char* arguments;
        const char* err;
    };
    const Case cases[] = {
        {"supervised data.csv --target y --temp-dir locked",
         "error 120001: the directory for temporary files does not exist, or no file can be made in it"},
        {"supervised - --target y --temp-dir locked < <(cat data.csv)",
         "cannot make a temporary file in locked: Permission denied"},
        {"supervised data.csv --target y --report locked/page.html",
         "cannot write locked/page.html: Permission denied"},
        {"apply bins.json data.csv -o locked/out.csv", "cannot write locked/out.csv: Permission denied"},
    };
    for (const Case& c : cases)
    {
        const Outcome outcome = Shell("bash -c \"" + lead + " " + c.arguments + "\"");
        EXPECT_EQ(1, outcome.exitCode) << c.arguments;
        EXPECT_EQ("", outcome.out) << c.arguments;
        EXPECT_EQ("mcbin: " + std::string(c.err) + "\n", outcome.err);
    }
    EXPECT_TRUE(std::filesystem::is_empty(locked));
}

TEST_F(McbinFaultsOnTerminal, AFileThatChangesBetweenThePassesIsAFailureAndOneThatVanishesIsNot)
{
    const std::string data = MakeTable(200000, 6);
    const auto end = static_cast<std::streamoff>(data.size());
    struct Case
    {
        const char* what;
        std::function<void(const std::string&)> change;
        int exitCode;
    };
    const Case cases[] = {
        {"shorter", [&](const std::string& path) { std::filesystem::resize_file(path, data.size() - 100); }, 1},
        {"longer", [&](const std::string& path) { std::ofstream(path, std::ios::app) << "a,1,1,1,1,1,1\n"; }, 1},
        {"another category",
         [&](const std::string& path) { (std::fstream(path).seekp(end - 100) << "\nx,1,1,1,1,1,1\n"); }, 1},
        {"gone", [](const std::string& path) { std::filesystem::remove(path); }, 0},
    };
    for (const Case& c : cases)
    {
        Write("data.csv", data);

        Terminal terminal(fData.Path(), fTemporary.Path(), "supervised data.csv --target y");
        ASSERT_TRUE(terminal.WaitFor("reading the records: 50000 rows")) << terminal.GetText();
        c.change(fData.File("data.csv"));

        EXPECT_EQ(c.exitCode, terminal.GetExitCode()) << c.what;
        EXPECT_EQ(c.exitCode == 0, terminal.GetText().find("mcbin: data.csv") == std::string::npos) << c.what;
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
    EXPECT_NE(std::string::npos, RunOn("x\n1\n", "apply bins.json", "").err.find("no column is named 'g'"));
    EXPECT_NE(std::string::npos,
              RunOn("x,g\n1,a\nten,a\n", "apply bins.json", "").err.find("line 3: column 'x': 'ten' is not a number"));
    EXPECT_NE(std::string::npos, RunOn("x,g\n1,c\n", "apply bins.json", "")
                                     .err.find("line 2: column 'g': 'c' is a category that the bins don't know"));
    EXPECT_EQ("x,g,x_bin,g_bin\nten,c,,\n-5,a,0,0\n",
              RunOn("x,g\nten,c\n-5,a\n", "apply bins.json", "--bad missing").out);
    EXPECT_EQ("g,x,id\n{b},\"(3, +inf)\",\"a,b\"\n",
              RunOn("g,x,id\nb,1e9,\"a,b\"\n", "apply bins.json", "--labels --in-place-columns").out);
}

TEST_F(McbinFaults, ADamagedFileOfBinsIsRefusedInWordsThatNameIt)
{
    struct Case
    {
        const char* change; ///< what sed does to a good file
        const char* words;
    };
    const Case cases[] = {
        {"9,$d", "line 9: this is not JSON"},
        {"s/\"weight\": 3/\"weight\": 1e999/", "line 58: this is not JSON"},
        {"s/mcobnqrt-bins/other/", "this is not a document of bins"},
        {"s/\"left\": 3/\"left\": 18446744073709551615/", "results[0].bins[1]: the bin does not lie between"},
    };
    RunOn("x,y\n1,0\n2,0\n3,0\n4,1\n5,1\n6,1\n7,1\n", "supervised", "--target y --format json >good.json");
    ASSERT_EQ(0, Run("apply good.json data.csv").exitCode);

    for (const Case& c : cases)
    {
        const Outcome outcome =
            Shell("sed '" + std::string(c.change) + "' good.json >bins.json; mcbin apply bins.json data.csv");
        EXPECT_EQ(1, outcome.exitCode) << c.change;
        EXPECT_EQ("", outcome.out) << c.change;
        EXPECT_EQ(0u, outcome.err.find("mcbin: bins.json: " + std::string(c.words))) << c.change << outcome.err;
    }
    EXPECT_EQ("mcbin: none.json: No such file or directory\n", Run("apply none.json data.csv").err);
}

TEST_F(McbinFaultsOnTerminal, CtrlCAmongTheAttributesPrintsWhatWasFound)
{
    Write("data.csv", MakeTable(100000, 12));
    Write("page.html", "former");

    Terminal terminal(fData.Path(), fTemporary.Path(),
                      "supervised data.csv --target y --format json --report page.html >bins.json");
    ASSERT_TRUE(terminal.WaitFor("binned 1 of 12: x0")) << terminal.GetText();
    terminal.PressCtrlC();

    EXPECT_EQ(130, terminal.GetExitCode());
    EXPECT_NE(std::string::npos, terminal.GetText().find("mcbin: interrupted; these are the results up to then"));
    const Outcome applied = Shell("head -n 3 data.csv | mcbin apply bins.json -");
    EXPECT_NE(std::string::npos, applied.out.find(",x0_bin")) << applied.err;
    EXPECT_EQ(std::string::npos, applied.out.find(",x11_bin"));
    EXPECT_NE(std::string::npos, terminal.GetText().find("mcbin: interrupted; the report is not written"));
    EXPECT_EQ("former", ReadFile(fData.File("page.html"))) << "the page of a whole run";
}

TEST_F(McbinFaultsOnTerminal, CtrlCInAPassEndsItWithoutResults)
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

TEST_F(McbinFaultsOnTerminal, CtrlCWhileBinsAreAppliedLeavesTheFormerFile)
{
    Write("data.csv", MakeTable(200000, 6));
    Run("supervised data.csv --target y --format json >bins.json");
    Write("out.csv", "former");
    const std::size_t numFiles = fData.FileNames().size();

    Terminal terminal(fData.Path(), fTemporary.Path(), "apply bins.json data.csv -o out.csv");
    ASSERT_TRUE(terminal.WaitFor("applying the bins: 65536 rows")) << terminal.GetText();
    terminal.PressCtrlC();

    EXPECT_EQ(130, terminal.GetExitCode());
    EXPECT_EQ("former", ReadFile(fData.File("out.csv")));
    EXPECT_EQ(numFiles, fData.FileNames().size());
}

TEST_F(McbinFaults, OneCtrlCEndsAWaitForTheReaderOfAPipeAndASecondOneEndsAllElseAtOnce)
{
    Write("data.csv", MakeTable(200000, 3));
    Run("supervised data.csv --target y --format json >bins.json");
    const std::vector<std::string> arguments{"apply", "bins.json", "data.csv"};

    const Piped read(fData.Path(), arguments);
    read.Interrupt();
    EXPECT_NE(std::string::npos, read.ReadAll().find("mcbin: interrupted"));
    const int status = read.FindEnd(0).value_or(-1);
    EXPECT_TRUE(WIFEXITED(status));
    EXPECT_EQ(130, WEXITSTATUS(status));

    // Nobody reads the message of the first one, so the program waits for that.
    const Piped unread(fData.Path(), arguments);
    std::optional<int> end;
    while (!(end = unread.FindEnd(WNOHANG))) unread.Interrupt();
    EXPECT_TRUE(WIFSIGNALED(*end));
    EXPECT_EQ(SIGINT, WTERMSIG(*end));
}
