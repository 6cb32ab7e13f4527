#include "tests/hosts/mcbinrun.h"

#include <filesystem>
#include <string>

#include <sys/stat.h>
#include <unistd.h>

// The files that the tool writes: what they replace, and what they are written through.

namespace
{

class McbinFiles : public Mcbin
{
protected:
    void SetUp() override
    {
        const std::string data = "x,y\n1,a\n2,a\n3,a\n4,b\n5,b\n6,b\n7,b\n";
        ASSERT_EQ(0, RunOn(data, "supervised", "--target y --format json >bins.json").exitCode);
        Write("data.csv", "x\n1\n9\n");
    }

    Outcome ApplyTo(const std::string& output) const { return Run("apply bins.json data.csv -o " + output); }

    struct stat GetStatus(const std::string& name) const
    {
        struct stat status = {};
        EXPECT_EQ(0, stat(fData.File(name).c_str(), &status)) << name;
        return status;
    }

    mode_t GetMode(const std::string& name) const { return GetStatus(name).st_mode & 07777; }
};

constexpr const char* kApplied = "x,x_bin\n1,0\n9,1\n";

} // namespace

TEST_F(McbinFiles, KeepTheModeAndTheOwnerOfWhatTheyReplaceAndNewOnesGetTheUmasks)
{
    for (const char* output : {"out.csv", "page.html"})
    {
        Write(output, "former");
        ASSERT_EQ(0, chmod(fData.File(output).c_str(), 0640));
        if (geteuid() == 0)
        {
            ASSERT_EQ(0, chown(fData.File(output).c_str(), 1234, 5678));
        }
    }
    EXPECT_EQ(0,
              Shell("umask 002; mcbin apply bins.json data.csv -o out.csv; mcbin apply bins.json data.csv -o new.csv; "
                    "mcbin equal-frequency data.csv --report page.html; umask 077; "
                    "mcbin apply bins.json data.csv -o own.csv")
                  .exitCode);

    for (const char* output : {"out.csv", "page.html"})
    {
        EXPECT_EQ(0640u, GetMode(output)) << output;
        if (geteuid() == 0)
        {
            EXPECT_EQ(1234u, GetStatus(output).st_uid) << output;
            EXPECT_EQ(5678u, GetStatus(output).st_gid) << output;
        }
    }
    EXPECT_EQ(kApplied, ReadFile(fData.File("out.csv")));
    EXPECT_EQ(0664u, GetMode("new.csv"));
    EXPECT_EQ(0600u, GetMode("own.csv"));
}

TEST_F(McbinFiles, OneThatMayNotBeWrittenIsNotReplaced)
{
    Write("out.csv", "former");
    ASSERT_EQ(0, chmod(fData.File("out.csv").c_str(), 0444));
    // Root may write everywhere, unless that is taken away.
    const std::string lead = geteuid() == 0 ? "setpriv --bounding-set -dac_override " : "";

    const Outcome outcome = Shell(lead + "'" MCBIN_PATH "' apply bins.json data.csv -o out.csv");

    EXPECT_EQ(1, outcome.exitCode);
    EXPECT_EQ("mcbin: cannot write out.csv: Permission denied\n", outcome.err);
    EXPECT_EQ("former", ReadFile(fData.File("out.csv")));
}

TEST_F(McbinFiles, ALinkStaysOneAndWhatItLeadsToIsWritten)
{
    std::filesystem::create_directory(fData.File("there"));
    Write("there/old.csv", "former");
    Shell("ln -s there/old.csv old; ln -s there/new.csv new; ln -s new chain; ln -s circle circle");

    EXPECT_EQ(0, ApplyTo("old").exitCode);
    EXPECT_EQ(0, ApplyTo("chain").exitCode);
    EXPECT_EQ("mcbin: cannot write circle: Too many levels of symbolic links\n", ApplyTo("circle").err);

    for (const char* link : {"old", "new", "chain", "circle"})
        EXPECT_TRUE(std::filesystem::is_symlink(fData.File(link))) << link;
    EXPECT_EQ(kApplied, ReadFile(fData.File("there/old.csv")));
    EXPECT_EQ(kApplied, ReadFile(fData.File("there/new.csv")));
}

TEST_F(McbinFiles, WhatIsNoFileIsWrittenAsItStands)
{
    // Opened by the shell, a file keeps what stands before, and what follows finds its end. This link is as
    // /dev/stdout, which a faulty tool might replace if root tests it.
    EXPECT_EQ(
        "before\n" + std::string(kApplied) + "after\n",
        Shell("ln -s /proc/self/fd/1 stdout; echo before; mcbin apply bins.json data.csv -o stdout; echo after").out);
    EXPECT_EQ("before\n" + std::string(kApplied),
              Shell("{ echo before >&3; mcbin apply bins.json data.csv -o /dev/fd/3; } 3>more; cat more").out);
    EXPECT_EQ(kApplied, Shell("mkfifo pipe; cat pipe & mcbin apply bins.json data.csv -o pipe; wait").out);
    EXPECT_TRUE(std::filesystem::is_fifo(fData.File("pipe")));

    std::filesystem::create_directory(fData.File("there"));
    EXPECT_EQ("mcbin: cannot write there: Is a directory\n", ApplyTo("there").err);
    EXPECT_EQ("mcbin: cannot write none/: No such file or directory\n", ApplyTo("none/").err);
    EXPECT_TRUE(std::filesystem::is_empty(fData.File("there")));
}
