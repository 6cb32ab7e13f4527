#include "binning/binalgorithm.h"
#include "tests/support/faultyplatform.h"
#include "tests/support/runs.h"
#include "tests/support/tempdir.h"

#include <gtest/gtest.h>

#include <csignal>
#include <filesystem>
#include <map>

#include <sys/stat.h>
#include <sys/wait.h>
#include <unistd.h>

// What kill -9 leaves: nothing can be done about the files, but nobody else can read them and nobody trips over them.

namespace
{

constexpr int kRowsPerFlush = 10000;
constexpr std::int64_t kTick = 0xabc000;

/// Binds an algorithm to a directory and to a tick of the clock, so that all of them want the same names for files.
class Host
{
public:
    explicit Host(const std::string& directory)
    {
        fPlatform.fTick = kTick;
        BINSettings settings = SupervisedSettings();
        settings.SetTempDirName(directory);
        const BINVarList list = AVarList().WithAttribute("age").WithTarget("bought", 2);
        fRun = std::make_unique<Supervised>(std::make_unique<BINAlgorithm>(settings, list, &fPlatform));
        for (int i = 0; i < 2 * kRowsPerFlush; ++i) fRecords.Add({1.0 * (i % 100), i % 100 < 50 ? 0.0 : 1.0});
    }

    std::vector<double> CutPoints()
    {
        EXPECT_TRUE(fRun->Run(fRecords).IsOK());
        return fRun->All().back().GetCutPoints();
    }

    RecordTable fRecords;

private:
    FaultyPlatform fPlatform;
    std::unique_ptr<Supervised> fRun;
};

/// Starts a run in a process that is killed when the library asks for this record.
void KillRunAt(int row, const std::string& directory)
{
    const pid_t child = fork();
    ASSERT_GE(child, 0);
    if (child == 0)
    {
        alarm(120);
        umask(0);
        Host host(directory);
        host.fRecords.fBeforeNext = [&](std::size_t next)
        {
            if (static_cast<int>(next) == row)
                raise(SIGKILL);
        };
        host.CutPoints();
        _exit(1);
    }
    int state = 0;
    ASSERT_EQ(child, waitpid(child, &state, 0));
    ASSERT_TRUE(WIFSIGNALED(state) && WTERMSIG(state) == SIGKILL) << state;
}

std::map<std::string, std::uintmax_t> SizesByName(const TempDir& dir)
{
    std::map<std::string, std::uintmax_t> sizes;
    for (const std::string& name : dir.FileNames()) sizes[name] = std::filesystem::file_size(dir.File(name));
    return sizes;
}

} // namespace

TEST(KilledProcess, LeavesFilesForItsUserAloneAndTheNextRunIsUndisturbed)
{
    const TempDir dir;
    const std::vector<double> expected{49.0};

    KillRunAt(kRowsPerFlush + 1, dir.Path());

    const auto left = SizesByName(dir);
    EXPECT_EQ((std::map<std::string, std::uintmax_t>{{"abc000", 8 * kRowsPerFlush}, {"abc001", 8 * kRowsPerFlush}}),
              left);
    for (const auto& [name, size] : left)
        EXPECT_EQ(std::filesystem::perms(0600), std::filesystem::status(dir.File(name)).permissions()) << name;
    EXPECT_EQ(expected, Host(dir.Path()).CutPoints());
    EXPECT_EQ(left, SizesByName(dir)) << "they are not the next run's to use or to remove";
}

TEST(KilledProcess, LeavesNoFileBeforeTheFirstFlush)
{
    const TempDir dir;

    KillRunAt(kRowsPerFlush - 1, dir.Path());

    EXPECT_TRUE(dir.IsEmpty());
}
