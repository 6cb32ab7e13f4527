#ifndef MCOBNQRT_TESTS_MCBINRUN_H
#define MCOBNQRT_TESTS_MCBINRUN_H

#include "tests/support/tempdir.h"

#include <gtest/gtest.h>

#include <cstdlib>
#include <fstream>
#include <sstream>
#include <string>

#include <sys/wait.h>

struct Outcome
{
    int exitCode;
    std::string out;
    std::string err;
};

inline std::string ReadFile(const std::string& path)
{
    std::ostringstream text;
    text << std::ifstream(path, std::ios::binary).rdbuf();
    return text.str();
}

/// Runs the program as its user would, through a shell, in a directory with the data; MCBIN_PATH and EXAMPLE_DATA come
/// from the build. What it has left of temporary files is a fault.
class Mcbin : public testing::Test
{
protected:
    void TearDown() override { EXPECT_TRUE(fTemporary.IsEmpty()); }

    /// `arguments` are those of a shell, which may lead to further commands.
    Outcome Run(const std::string& arguments) const { return Shell("mcbin " + arguments); }

    /// In the command, mcbin stands for the program.
    Outcome Shell(const std::string& command) const
    {
        const std::string script = "cd " + fData.Path() + " && export TMPDIR=" + fTemporary.Path() +
                                   " && mcbin() { '" MCBIN_PATH "' \"$@\"; } && { " + command + "\n} >out 2>err";
        const int status = std::system(script.c_str());
        return {WIFEXITED(status) ? WEXITSTATUS(status) : -1, ReadFile(fData.File("out")), ReadFile(fData.File("err"))};
    }

    void Write(const std::string& name, const std::string& text) const
    {
        std::ofstream(fData.File(name), std::ios::binary) << text;
    }

    /// Runs on data.csv with these contents.
    Outcome RunOn(const std::string& data, const std::string& command, const std::string& options) const
    {
        Write("data.csv", data);
        return Run(command + " data.csv " + options);
    }

    TempDir fData;
    TempDir fTemporary;
};

#endif
