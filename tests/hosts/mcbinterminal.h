#ifndef MCOBNQRT_TESTS_MCBINTERMINAL_H
#define MCOBNQRT_TESTS_MCBINTERMINAL_H

#include "tests/hosts/mcbinrun.h"

#include <gtest/gtest.h>

#include <array>
#include <cerrno>
#include <csignal>
#include <cstdlib>
#include <cstring>
#include <string>

#include <pty.h>
#include <sys/wait.h>
#include <unistd.h>

/// Seconds after which the system ends a program that a test waits for, so that the wait ends and the test fails.
constexpr unsigned int kLongestRun = 600;

/// The program on a terminal of its own, in a directory with the data.
class Terminal
{
public:
    /// `settings` are those of the environment, as in "NO_COLOR=1".
    Terminal(const std::string& directory, const std::string& temporary, const std::string& arguments,
             const std::string& settings = "", unsigned short width = 100)
    {
        winsize size = {};
        size.ws_row = 24;
        size.ws_col = width;
        fProcess = forkpty(&fMaster, nullptr, nullptr, &size);
        if (fProcess == 0)
        {
            alarm(kLongestRun);
            setenv("TMPDIR", temporary.c_str(), 1);
            setenv("TERM", "xterm", 1);
            unsetenv("NO_COLOR");
            const std::string script =
                "cd " + directory + " && exec env " + settings + " '" MCBIN_PATH "' " + arguments;
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

    /// To the program itself, not to its terminal.
    void Signal(int number) const { EXPECT_EQ(0, kill(fProcess, number)); }

    /// -1 if it was killed.
    int GetExitCode()
    {
        WaitFor("\xFF"); // never comes
        int status = 0;
        waitpid(fProcess, &status, 0);
        return WIFEXITED(status) ? WEXITSTATUS(status) : -1;
    }

    /// All that has come so far. A terminal ends lines with CRLF.
    const std::string& GetText() const { return fText; }

private:
    int fMaster = -1;
    pid_t fProcess = -1;
    std::string fText;
};

/// For tests that need a Terminal.
class McbinOnTerminal : public Mcbin
{
protected:
    void SetUp() override
    {
        int master = -1;
        int slave = -1;
        if (openpty(&master, &slave, nullptr, nullptr, nullptr) != 0)
            GTEST_SKIP() << "this test needs a pseudo-terminal, and the system gives none: " << std::strerror(errno);
        close(master);
        close(slave);
    }
};

#endif
