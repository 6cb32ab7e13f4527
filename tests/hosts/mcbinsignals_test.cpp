#include "tests/hosts/mcbinrun.h"
#include "tests/hosts/mcbinterminal.h"

#include <algorithm>
#include <array>
#include <csignal>
#include <string>
#include <vector>

#include <fcntl.h>
#include <sys/wait.h>
#include <unistd.h>

// A Ctrl-C ends the program that writes into the tool's pipe as well as it asks the tool to end. The end of the input
// is then no end of the data.

namespace
{

/// The program with a pipe for its standard input.
class Fed
{
public:
    Fed(const std::string& directory, const std::string& temporary, const std::string& arguments)
    {
        EXPECT_EQ(0, pipe2(fPipe.data(), O_CLOEXEC));
        fProcess = fork();
        if (fProcess == 0)
        {
            alarm(kLongestRun);
            dup2(fPipe[0], STDIN_FILENO);
            const std::string script =
                "cd " + directory + " && TMPDIR=" + temporary + " exec '" MCBIN_PATH "' " + arguments + " >out 2>err";
            execl("/bin/sh", "sh", "-c", script.c_str(), nullptr);
            _exit(127);
        }
        close(fPipe[0]);
    }
    Fed(const Fed&) = delete;
    Fed& operator=(const Fed&) = delete;

    /// Returns when the program has read all but what a pipe holds.
    void Feed(const std::string& text) const
    {
        for (std::size_t begin = 0; begin < text.size();)
        {
            const ssize_t size = write(fPipe[1], text.data() + begin, std::min<std::size_t>(4096, text.size() - begin));
            ASSERT_LT(0, size);
            begin += static_cast<std::size_t>(size);
        }
    }

    /// The program finds the signal and the end of its input at once, and first the signal. \return the exit code.
    int EndBySignal(int signal) const
    {
        int status = 0;
        kill(fProcess, SIGSTOP);
        waitpid(fProcess, &status, WUNTRACED);
        EXPECT_TRUE(WIFSTOPPED(status));
        kill(fProcess, signal);
        close(fPipe[1]);
        kill(fProcess, SIGCONT);
        waitpid(fProcess, &status, 0);
        return WIFEXITED(status) ? WEXITSTATUS(status) : -1;
    }

private:
    std::array<int, 2> fPipe{};
    pid_t fProcess = -1;
};

using McbinSignals = Mcbin;

} // namespace

TEST_F(McbinSignals, TheEndOfTheInputBehindOneIsNoSuccess)
{
    // Rows of 16 bytes, so that a pipe of any size holds whole ones, and the data end with one.
    std::string rows;
    for (int i = 1000000; i < 1150000; ++i) rows += std::to_string(i) + (i % 10 < 5 ? ",a,-----\n" : ",b,-----\n");
    ASSERT_EQ(0u, rows.size() % 2400000);
    const std::string header = "x,y,text\n";
    ASSERT_EQ(0, RunOn(header + rows.substr(0, 4096), "equal-frequency", "--format json >bins.json").exitCode);
    Write("result", "former");
    for (const char* arguments : {"apply bins.json - -o result", "supervised - --target y --report result"})
    {
        for (const int signal : {SIGINT, SIGTERM, SIGHUP})
        {
            const std::size_t numFiles = fData.FileNames().size();

            const Fed fed(fData.Path(), fTemporary.Path(), arguments);
            fed.Feed(header);
            fed.Feed(rows);

            EXPECT_EQ(130, fed.EndBySignal(signal)) << arguments << ReadFile(fData.File("err"));
            EXPECT_EQ("former", ReadFile(fData.File("result"))) << arguments;
            EXPECT_EQ("", ReadFile(fData.File("out"))) << arguments;
            EXPECT_EQ("mcbin: interrupted; there are no results yet\n", ReadFile(fData.File("err"))) << arguments;
            EXPECT_EQ(numFiles, fData.FileNames().size()) << arguments;
        }
    }
}
