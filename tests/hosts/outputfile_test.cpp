#include "tests/hosts/mcbinrun.h"

#include "hosts/mcbin/failure.h"
#include "hosts/mcbin/output/outputfile.h"

#include <cerrno>
#include <filesystem>
#include <string>
#include <vector>

#include <unistd.h>

// What a loss of power would leave of an output file. Nothing but the calls of the system shows it, so this test is
// linked with the class, and takes the place of the function that flushes.

namespace
{

struct Flush
{
    std::string path;     ///< of the file or directory that is flushed
    std::string contents; ///< of the file out.csv at that time
};

std::vector<Flush> gFlushes;
std::string gOutput;
int gError = 0;

} // namespace

extern "C" int fsync(int descriptor)
{
    gFlushes.push_back(
        {std::filesystem::read_symlink("/proc/self/fd/" + std::to_string(descriptor)).string(), ReadFile(gOutput)});
    errno = gError;
    return gError == 0 ? 0 : -1;
}

TEST(OutputFile, IsFlushedBeforeItTakesItsNameAndItsDirectoryBehindThat)
{
    const TempDir directory;
    gFlushes.clear();
    gOutput = directory.File("out.csv");
    std::ofstream(gOutput) << "former";

    OutputFile output(gOutput);
    output.Write("new");
    output.Commit();

    ASSERT_EQ(2u, gFlushes.size());
    EXPECT_EQ(0u, gFlushes[0].path.find(gOutput + ".")) << gFlushes[0].path;
    EXPECT_EQ("former", gFlushes[0].contents);
    EXPECT_EQ(directory.Path(), gFlushes[1].path);
    EXPECT_EQ("new", gFlushes[1].contents);
}

TEST(OutputFile, WhatCannotBeFlushedReplacesNothing)
{
    const TempDir directory;
    gOutput = directory.File("out.csv");
    std::ofstream(gOutput) << "former";
    gError = EIO;
    {
        OutputFile output(gOutput);
        output.Write("new");
        EXPECT_THROW(output.Commit(), Failure);
    }
    gError = 0;

    EXPECT_EQ("former", ReadFile(gOutput));
    EXPECT_EQ(1u, directory.FileNames().size());
}
