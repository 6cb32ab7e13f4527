#include "binning/binalgorithm.h"
#include "tests/support/faultyplatform.h"
#include "tests/support/runs.h"
#include "tests/support/tempdir.h"

#include <cerrno>
#include <cstddef>
#include <cstdlib>
#include <ctime>
#include <fstream>
#include <iterator>
#include <sstream>
#include <stdexcept>
#include <tuple>

#include <fcntl.h>
#include <linux/filter.h>
#include <linux/seccomp.h>
#include <sys/mount.h>
#include <sys/prctl.h>
#include <sys/resource.h>
#include <sys/stat.h>
#include <sys/syscall.h>
#include <sys/wait.h>
#include <unistd.h>

namespace fs = std::filesystem;
using namespace MCBinning;
using namespace std::string_literals;

namespace
{

// At this tick of the clock the files of target and attribute get these names, if nobody has taken them.
constexpr std::int64_t kTick = 0xabc000;
const std::string kBoughtFile = "abc000";
const std::string kAgeFile = "abc001";

constexpr int kRowsPerFlush = 10000;
const std::vector<double> kCut{49.0}; ///< of Ages()

RecordTable Ages(int count)
{
    RecordTable records;
    for (int i = 0; i < count; ++i) records.Add({1.0 * (i % 100), i % 100 < 50 ? 0.0 : 1.0});
    return records;
}

BINVarList AgeList()
{
    return AVarList().WithAttribute("age").WithTarget("bought", 2);
}

/// An algorithm for Ages() that begins at kTick.
std::unique_ptr<Supervised> AHost(const std::string& directory)
{
    static FaultyPlatform platform;
    platform.fTick = kTick;
    BINSettings settings = SupervisedSettings();
    settings.SetTempDirName(directory);
    return std::make_unique<Supervised>(std::make_unique<BINAlgorithm>(settings, AgeList(), &platform));
}

/// The code of a failed run; else that of its last result, negated; else 0, or -1 if the cut is wrong.
long CodeOfRun(Supervised& host, IBINRecordSource& records)
{
    const MCStatus status = host.Run(records);
    if (status.IsError())
        return status.GetErrorCode();
    const BINAttributeTargetResults result = host.All().back();
    return result.GetStatus().IsOK() && result.GetCutPoints() != kCut ? -1 : -CodeOf(result);
}

long CodeOfRunIn(const std::string& directory)
{
    RecordTable records = Ages(200);
    return CodeOfRun(*AHost(directory), records);
}

/// Starts a process that exits with the result of `work`, or is ended if it hangs.
template<class Work>
pid_t StartChild(const Work& work)
{
    const pid_t child = fork();
    if (child == 0)
    {
        alarm(120);
        _exit(work());
    }
    return child;
}

int ExitCodeOf(pid_t child)
{
    int state = 0;
    return waitpid(child, &state, 0) == child && WIFEXITED(state) ? WEXITSTATUS(state) : -1;
}

/// \return the limit before.
rlim_t LimitFileHandles(rlim_t limit)
{
    rlimit handles{};
    getrlimit(RLIMIT_NOFILE, &handles);
    std::swap(limit, handles.rlim_cur);
    setrlimit(RLIMIT_NOFILE, &handles);
    return limit;
}

/// From now on the system refuses to tell this process when a file was made. False if that can't be had.
bool ForbidTimesOfBirth()
{
    sock_filter steps[] = {BPF_STMT(BPF_LD | BPF_W | BPF_ABS, offsetof(seccomp_data, nr)),
                           BPF_JUMP(BPF_JMP | BPF_JEQ | BPF_K, __NR_statx, 0, 1),
                           BPF_STMT(BPF_RET | BPF_K, SECCOMP_RET_ERRNO | ENOSYS),
                           BPF_STMT(BPF_RET | BPF_K, SECCOMP_RET_ALLOW)};
    const sock_fprog program{static_cast<unsigned short>(std::size(steps)), steps};
    return prctl(PR_SET_NO_NEW_PRIVS, 1, 0, 0, 0) == 0 && prctl(PR_SET_SECCOMP, SECCOMP_MODE_FILTER, &program) == 0;
}

/// The files, with the times of their last reading and writing.
std::vector<std::string> Snapshot(const TempDir& dir, std::vector<std::string> names)
{
    std::sort(names.begin(), names.end());
    for (std::string& name : names)
    {
        struct stat found = {};
        lstat(dir.File(name).c_str(), &found);
        std::ostringstream file;
        file << name << ' ' << found.st_ino << ' ' << found.st_mode << ' ' << found.st_size << ' '
             << found.st_atim.tv_sec << ' ' << found.st_mtim.tv_sec;
        name = file.str();
    }
    return names;
}

void WriteFile(const std::string& path)
{
    std::ofstream(path) << std::string(std::size_t{8} * kRowsPerFlush, 'x'); // as long as ours after a flush
}

/// What happens to a file of ours, or to the name of one that is still to come.
struct Mishap
{
    const char* fWhat;
    std::function<void(const std::string& path)> fDo;
    bool fIsPlant = true; ///< somebody puts something of theirs under our name
};

const std::vector<Mishap> kMishaps{
    {"a file with the number of the former one", WriteFile},
    {"a file",
     [](const std::string& path)
     {
         WriteFile(path + "with the former number");
         WriteFile(path);
         fs::remove(path + "with the former number");
     }},
    {"a dangling link", [](const std::string& path) { fs::create_symlink("nowhere", path); }},
    {"a link to a victim", [](const std::string& path) { fs::create_symlink("victim", path); }},
    {"a pipe", [](const std::string& path) { mkfifo(path.c_str(), 0600); }},
    {"a directory", [](const std::string& path) { fs::create_directory(path); }},
    {"nothing", [](const std::string& path) { fs::remove(path); }, false},
    {"an emptied file", [](const std::string& path) { fs::resize_file(path, 0); }, false},
    {"a file cut within a value", [](const std::string& path) { fs::resize_file(path, 12); }, false}};

/// A plant gets times so old that any later reading or writing shows.
void Strike(const Mishap& mishap, const std::string& path)
{
    if (!mishap.fIsPlant)
        return mishap.fDo(path);
    // Our file and one that gets its number differ in their times of birth alone, once the clock has gone on.
    timespec start{};
    clock_gettime(CLOCK_REALTIME_COARSE, &start);
    for (timespec now = start; now.tv_nsec == start.tv_nsec;) clock_gettime(CLOCK_REALTIME_COARSE, &now);
    fs::remove(path);
    mishap.fDo(path);
    const timespec times[]{{1000, 0}, {2000, 0}};
    utimensat(AT_FDCWD, path.c_str(), times, AT_SYMLINK_NOFOLLOW);
}

// The record of a run of two flushes ahead of which a mishap comes.
constexpr int kAheadOfTheRun = -1;
constexpr int kAtTheFirstRecord = 0; ///< the names are picked, but no file is made
constexpr int kAtTheSecondFlush = kRowsPerFlush;
constexpr int kBetweenTwoRuns = kRowsPerFlush + 1;

void TryMishap(const Mishap& mishap, const std::string& name, int when)
{
    SCOPED_TRACE(name + " becomes " + mishap.fWhat + " at " + std::to_string(when));
    const TempDir dir;
    Strike(kMishaps[0], dir.File("victim"));
    std::vector<std::string> theirs;
    const auto strike = [&]
    {
        Strike(mishap, dir.File(name));
        theirs = Snapshot(dir, mishap.fIsPlant ? std::vector{name, "victim"s} : std::vector{"victim"s});
    };
    RecordTable records = Ages(kRowsPerFlush + 1);
    records.fBeforeNext = [&](std::size_t row) { static_cast<int>(row) == when ? strike() : void(); };
    auto host = AHost(dir.Path());
    if (when == kAheadOfTheRun)
        strike();

    long code = CodeOfRun(*host, records);
    if (when == kBetweenTwoRuns)
    {
        EXPECT_EQ(0, code);
        strike();
        code = CodeOfRun(*host, records);
    }

    const bool isAvoided = when <= kAtTheFirstRecord;                        // a taken name is passed over
    const bool mayBeUnfelt = when == kBetweenTwoRuns && name == kBoughtFile; // the target's file stays open
    const long told = when == kAtTheSecondFlush ? BINStatusCannotOpenTempFile : -BINStatusCannotOpenTempFile;
    EXPECT_TRUE(code == (isAvoided ? 0 : told) || (mayBeUnfelt && code == 0)) << code;
    host.reset();
    EXPECT_EQ(theirs, Snapshot(dir, dir.FileNames()));
}

/// A host that throws in one of its operations, at the n-th call.
struct ThrowingHost : RecordTable, ProgressListener, MCQueryCancel
{
    ThrowingHost(const std::string& operation, int call, RecordTable records = {})
        : RecordTable(std::move(records)), fOperation(operation), fCallsLeft(call)
    {
        fBeforeNext = [this](std::size_t) { Enter("Next"); };
    }

    bool HasNext() override { return Enter("HasNext") && RecordTable::HasNext(); }
    void ReportProgress(ProgressReport&) override { Enter("ReportProgress"); }
    bool QueryCancel() override { return !Enter("QueryCancel"); }

    bool Enter(const std::string& operation)
    {
        if (operation == fOperation && --fCallsLeft == 0)
            throw std::runtime_error(operation);
        return true;
    }

    std::string fOperation;
    int fCallsLeft;
};

} // namespace

TEST(RealFault, ADirectoryThatNoFileCanBeMadeInIsMissing)
{
    const TempDir dir;
    WriteFile(dir.File("file"));
    fs::create_symlink("loop", dir.File("loop"));
    std::string longPath = dir.Path();
    while (longPath.size() < 4090) longPath += "/."; // is a directory, but leaves no room for a name

    for (const std::string& directory : {dir.File("none"), dir.File("file"), dir.File("file/below"), dir.File("loop"),
                                         dir.File(std::string(300, 'n')), dir.File("\0"s), longPath})
        EXPECT_EQ(BINStatusTempDirNotFound, CodeOfRunIn(directory)) << directory;

    EXPECT_EQ(2U, dir.FileNames().size());
}

TEST(RealFault, ADirectoryWithoutTheRightsIsMissing)
{
    constexpr uid_t kNobody = 65534;
    for (const auto& [rights, code] :
         {std::pair(0333, 0), {0555, BINStatusTempDirNotFound}, {0666, BINStatusTempDirNotFound}})
    {
        const TempDir dir;
        chmod(dir.Path().c_str(), static_cast<mode_t>(rights));
        const auto isWrong = [&dir, expected = code]
        {
            if (geteuid() == 0 && setresuid(kNobody, kNobody, kNobody) != 0) // nothing can be forbidden to root
                return true;
            return CodeOfRunIn(dir.Path()) != expected;
        };

        EXPECT_EQ(0, ExitCodeOf(StartChild(isWrong))) << std::oct << rights;

        chmod(dir.Path().c_str(), 0700);
        EXPECT_TRUE(dir.IsEmpty());
    }
}

TEST(RealFault, AFullDiskEndsThePass)
{
    const std::vector<std::tuple<const char*, int, int>> cases{
        {"size=64k", 30000, 10000},  // full at the first file of the first flush
        {"size=128k", 30000, 10000}, // at its second file
        {"size=160k", 30000, 20000}, // at the second flush
        {"size=160k", 10300, 10300}, // at the last flush, which is so small that only the closing fails
        {"size=4k", 200, 200},       // at the only flush, where only the closing fails
        {"nr_inodes=2", 200, 200}};  // at the making of the second file
    for (const auto& [options, rows, rowsRead] : cases)
    {
        SCOPED_TRACE(options + std::to_string(rows));
        const TempDir dir;
        if (mount("tmpfs", dir.Path().c_str(), "tmpfs", 0, options) != 0)
            GTEST_SKIP() << "no small disk can be mounted here";
        RecordTable records = Ages(rows);
        auto host = AHost(dir.Path());

        EXPECT_EQ(BINStatusCannotOpenTempFile, CodeOfRun(*host, records));
        EXPECT_EQ(rowsRead, records.fNumNext);
        EXPECT_EQ(BINStatusCannotOpenTempFile, CodeOfRun(*host, records));

        host.reset();
        EXPECT_TRUE(dir.IsEmpty());
        EXPECT_EQ(0, umount(dir.Path().c_str())) << "a file is still open";
        umount2(dir.Path().c_str(), MNT_DETACH); // where the first one failed
    }
}

TEST(RealFault, WithoutFileHandlesTheStepThatNeedsOneFails)
{
    const TempDir dir;
    RecordTable records = Ages(200);
    RecordTable unreadRecords = Ages(200);
    RecordTable lateRecords = Ages(200);
    lateRecords.fBeforeNext = [](std::size_t) { LimitFileHandles(0); };
    auto host = AHost(dir.Path());
    EXPECT_EQ(0, CodeOfRun(*host, records));
    EXPECT_EQ(0, CodeOfRunIn(dir.Path())); // to its end: UBSan needs a handle when it meets a class for the first time

    const rlim_t limit = LimitFileHandles(0);
    const bool isHeldTo = open("none", O_RDONLY) < 0 && errno == EMFILE;
    const long reading = CodeOfRun(*host, records);
    const long probing = CodeOfRun(*AHost(dir.Path()), unreadRecords);
    LimitFileHandles(limit);
    if (!isHeldTo)
        GTEST_SKIP() << "what runs this program opens files before it looks at the limit, as valgrind does";
    const long making = CodeOfRun(*AHost(dir.Path()), lateRecords);
    LimitFileHandles(limit);

    EXPECT_EQ(-BINStatusCannotOpenTempFile, reading);
    EXPECT_EQ(BINStatusCannotOpenTempFile, probing);
    EXPECT_EQ(0, unreadRecords.fNumNext);
    EXPECT_EQ(BINStatusCannotOpenTempFile, making);
    EXPECT_EQ(0, CodeOfRun(*host, records));
    host.reset();
    EXPECT_TRUE(dir.IsEmpty());
}

TEST(RealFault, MishapsToFilesAreToldAndWhatIsNotOursIsLeftAlone)
{
    for (const Mishap& mishap : kMishaps)
    {
        for (const std::string& name : {kBoughtFile, kAgeFile})
        {
            if (mishap.fIsPlant)
            {
                TryMishap(mishap, name, kAheadOfTheRun);
                TryMishap(mishap, name, kAtTheFirstRecord);
            }
            TryMishap(mishap, name, kAtTheSecondFlush);
            TryMishap(mishap, name, kBetweenTwoRuns);
        }
    }
    // What is written over an attribute's values can't be told from them, but a code that the pass never saw can.
    const auto overwrite = [](const std::string& path) { std::ofstream(path) << std::string(100000, 'x'); };
    TryMishap({"other numbers", overwrite, false}, kBoughtFile, kBetweenTwoRuns);
}

TEST(RealFault, TwoAlgorithmsInOneDirectoryAtOneTickDontMeet)
{
    const TempDir dir;
    const mode_t mask = umask(0);
    auto host = AHost(dir.Path());
    auto quickHost = AHost(dir.Path());
    RecordTable records = Ages(200);
    RecordTable quickRecords = Ages(200);
    // At the first record the names are picked, but no file is made.
    records.fBeforeNext = [&](std::size_t row) { EXPECT_EQ(0, row == 0 ? CodeOfRun(*quickHost, quickRecords) : 0); };

    EXPECT_EQ(0, CodeOfRun(*host, records));

    umask(mask);
    EXPECT_EQ(4U, dir.FileNames().size());
    for (const std::string& name : dir.FileNames())
        EXPECT_EQ(fs::perms(0600), fs::status(dir.File(name)).permissions()) << name;
    quickHost.reset();
    EXPECT_EQ(2U, dir.FileNames().size());
    EXPECT_EQ(0, CodeOfRun(*host, records));
    host.reset();
    EXPECT_TRUE(dir.IsEmpty());
}

TEST(RealFault, TwoProcessesInOneDirectoryAtOneTickDontMeet)
{
    const TempDir dir;
    const auto countFailures = [&]
    {
        int failures = 0;
        for (int run = 0; run < 50; ++run) failures += CodeOfRunIn(dir.Path()) != 0;
        return failures;
    };

    const pid_t child = StartChild(countFailures);

    EXPECT_EQ(0, countFailures());
    EXPECT_EQ(0, ExitCodeOf(child));
    EXPECT_TRUE(dir.IsEmpty());
}

TEST(RealFault, AChildThatDeletesTheObjectLeavesTheFilesToItsParent)
{
    const TempDir dir;
    RecordTable records = Ages(200);
    auto host = AHost(dir.Path());
    EXPECT_EQ(0, CodeOfRun(*host, records));
    EFBINSettings settings = EqualFrequencySettings(4);
    settings.SetTempDirName(dir.Path());
    auto otherHost = std::make_unique<EqualFrequency>(AgeList(), settings);
    RecordTable otherRecords = Ages(200);
    EXPECT_TRUE(otherHost->Run(otherRecords).IsOK());
    ASSERT_EQ(4U, dir.FileNames().size());

    const auto deleteBoth = [&]
    {
        host.reset();
        otherHost.reset();
        return 0;
    };
    EXPECT_EQ(0, ExitCodeOf(StartChild(deleteBoth)));

    EXPECT_EQ(4U, dir.FileNames().size());
    EXPECT_EQ(0, CodeOfRun(*host, records));
    deleteBoth();
    EXPECT_TRUE(dir.IsEmpty());
}

TEST(RealFault, AFileWhoseTimeOfBirthIsNotToldAnyMoreIsStillOurs)
{
    const TempDir dir;
    constexpr int kSkip = 77;
    const auto runTwiceAndDelete = [&dir]
    {
        RecordTable records = Ages(200);
        auto host = AHost(dir.Path());
        if (CodeOfRun(*host, records) != 0)
            return 1;
        if (!ForbidTimesOfBirth())
            return kSkip;
        if (CodeOfRun(*host, records) != 0)
            return 2;
        host.reset();
        return dir.IsEmpty() ? 0 : 3;
    };

    const int code = ExitCodeOf(StartChild(runTwiceAndDelete));

    if (code == kSkip)
        GTEST_SKIP() << "no system call can be forbidden here";
    EXPECT_EQ(0, code);

    // The reverse: the time of birth is unknown when the file is made, and known when it is removed.
    std::FILE* file = nullptr;
    FileIdentity identity;
    ASSERT_EQ(NameState::kFree, SystemPlatform()->CreateNewFile(dir.File("f"), file, identity));
    SystemPlatform()->CloseFile(file);
    identity.fBirth = 0;
    SystemPlatform()->RemoveFile(dir.File("f"), identity);
    EXPECT_TRUE(dir.IsEmpty());
}

TEST(RealFault, WithoutADirectoryForTemporaryFilesTheyGoWhereTheProgramIs)
{
    const TempDir dir;
    constexpr int kSkip = 77;
    const auto nameDirectory = [&dir]
    {
        unsetenv("TMPDIR");
        if (chroot(dir.Path().c_str()) != 0 || chdir("/") != 0)
            return kSkip;
        return SystemTempDirectory() == "./" ? 0 : 1;
    };

    const int code = ExitCodeOf(StartChild(nameDirectory));

    if (code == kSkip)
        GTEST_SKIP() << "this user may not change the root directory";
    EXPECT_EQ(0, code);
}

TEST(RealFault, AnExceptionOfTheHostEndsTheReadingOrLosesNothing)
{
    constexpr int kLate = kRowsPerFlush + 5;
    const std::vector<std::tuple<const char*, int, long>> cases{
        {"HasNext", 1, 0}, // ahead of the reading
        {"HasNext", kLate, BINStatusNoRecords},
        {"Next", 1, BINStatusNoRecords},
        {"Next", kLate, BINStatusNoRecords},
        {"QueryCancel", kLate, BINStatusNoRecords},
        {"ReportProgress", 1, BINStatusNoRecords},
        {"ReportProgress", 2, 0}}; // of an attribute, behind the reading
    for (const auto& [operation, call, laterCode] : cases)
    {
        SCOPED_TRACE(operation + std::to_string(call));
        const TempDir dir;
        ThrowingHost callbacks(operation, call, Ages(kLate + 5));
        auto host = AHost(dir.Path());
        (*host)->GetSettings()->SetNSkippedCasesReports(kLate);
        (*host)->SetProgressListener(&callbacks);
        (*host)->SetCancelPointer(&callbacks);

        EXPECT_THROW(CodeOfRun(*host, callbacks), std::runtime_error);

        EXPECT_EQ(laterCode, CodeOfRun(*host, callbacks));
        host.reset();
        EXPECT_TRUE(dir.IsEmpty());
    }
}

TEST(RealFault, AnExceptionAtTheCreationLeavesTheFactoryUsable)
{
    ThrowingHost callbacks("QueryCancel", 1);
    BINSettings settings = SupervisedSettings();
    settings.SetCancelPointer(&callbacks);
    BINVarList list = AgeList();
    BINFactory factory;

    EXPECT_THROW(factory.CreateBINAlgorithm(settings, list), std::runtime_error);

    EXPECT_NE(nullptr, std::unique_ptr<IBINAlgorithm>(factory.CreateBINAlgorithm(settings, list)));
}
