#include "tests/hosts/mcbinrun.h"
#include "tests/hosts/mcbinterminal.h"

#include <csignal>
#include <filesystem>
#include <vector>

// kill -9 in the middle: what is left is for its user alone, and the next run gives what it always gives.

namespace
{

std::string MakeTable(int rows)
{
    std::string data = "y,x\n";
    for (int row = 0; row < rows; ++row)
        data += std::string(row < rows / 3 ? "a" : "b") + "," + std::to_string(row + (row * 7919) % 13) + "\n";
    return data;
}

class McbinKilled : public McbinOnTerminal
{
protected:
    void SetUp() override
    {
        McbinOnTerminal::SetUp();
        Write("data.csv", MakeTable(200000));
    }

    /// What is left is the subject here.
    void TearDown() override {}

    void KillWhenItShows(const std::string& text, const std::string& arguments) const
    {
        Terminal terminal(fData.Path(), fTemporary.Path(), arguments);
        ASSERT_TRUE(terminal.WaitFor(text)) << terminal.GetText();
        terminal.Signal(SIGKILL);
        EXPECT_EQ(-1, terminal.GetExitCode());
    }
};

} // namespace

TEST_F(McbinKilled, LeavesTemporaryFilesForItsUserAloneAndTheNextRunIsUndisturbed)
{
    const std::string command = "supervised data.csv --target y --format json";
    const std::string expected = Run(command).out;
    ASSERT_TRUE(fTemporary.IsEmpty());

    KillWhenItShows("reading the records: 50000 rows", command);

    const std::vector<std::string> left = fTemporary.FileNames();
    EXPECT_EQ(2u, left.size());
    for (const std::string& name : left)
        EXPECT_EQ(std::filesystem::perms(0600), std::filesystem::status(fTemporary.File(name)).permissions()) << name;
    EXPECT_EQ(expected, Run(command).out);
    EXPECT_EQ(left.size(), fTemporary.FileNames().size()) << "they are not the next run's to use or to remove";
}

TEST_F(McbinKilled, LeavesTheFormerOutputAndTheNextRunReplacesIt)
{
    Run("supervised data.csv --target y --format json >bins.json");
    const std::string expected = Run("apply bins.json data.csv").out;
    Write("out.csv", "former");

    KillWhenItShows("applying the bins: 65536 rows", "apply bins.json data.csv -o out.csv");

    EXPECT_EQ("former", ReadFile(fData.File("out.csv")));
    EXPECT_EQ(0, Run("apply bins.json data.csv -o out.csv").exitCode);
    EXPECT_EQ(expected, ReadFile(fData.File("out.csv")));
}
