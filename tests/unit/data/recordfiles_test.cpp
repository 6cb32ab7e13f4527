#include "data/binaryrecorditerator.h"
#include "data/binrecordbuffer.h"
#include "data/recordfiles.h"
#include "tests/support/groupeddigits.h"
#include "tests/support/testpreparator.h"

#include <gtest/gtest.h>

#include <fstream>
#include <limits>

using MCBinning::BinaryRecordIterator;

namespace
{

void WriteFile(const std::string& path, const std::vector<double>& values, std::size_t extraBytes = 0)
{
    std::ofstream file(path, std::ios::binary);
    file.write(reinterpret_cast<const char*>(values.data()),
               static_cast<std::streamsize>(values.size() * sizeof(double)));
    file << std::string(extraBytes, 'x');
}

/// All values, through Next() while IsOK().
std::vector<double> ReadAll(BinaryRecordIterator& iterator)
{
    std::vector<double> values;
    while (iterator.IsOK()) values.push_back(iterator.Next());
    return values;
}

/// Temporary files in a directory of their own. The clock stands at 1, so that the first name is "1".
struct TestFiles
{
    explicit TestFiles(MCQueryCancel* query = nullptr, const std::string& end = "")
        : fMonitor(query), fFiles(fDirectory.Path() + end, &fMonitor, &fPlatform)
    {
        fPlatform.fTick = 1;
    }

    TempDir fDirectory;
    FaultyPlatform fPlatform;
    BINCancelMonitor fMonitor;
    RecordFiles fFiles;
};

} // namespace

TEST(BinaryRecordIterator, GivesEachValueOnceAndAgainAfterRewind)
{
    const TempDir directory;
    // The third file ends in half a value, which doesn't count.
    for (const auto& [values, extraBytes] :
         {std::pair<std::vector<double>, std::size_t>{{}, 0}, {{1.5}, 0}, {{1, 2, 3}, 4}})
    {
        WriteFile(directory.File("f"), values, extraBytes);
        BinaryRecordIterator iterator(directory.File("f"));
        EXPECT_EQ(values, ReadAll(iterator));
        EXPECT_EQ(1, iterator.GetStatus());
        EXPECT_EQ(0.0, iterator.Next());
        EXPECT_EQ(values.empty() ? 1 : 0, iterator.Rewind());
        EXPECT_EQ(values, ReadAll(iterator));
    }
}

TEST(BinaryRecordIterator, FileThatIsNotThereIsSaidOnStandardOutput)
{
    const TempDir directory;
    testing::internal::CaptureStdout();
    BinaryRecordIterator iterator(directory.File("none"));

    EXPECT_EQ("Error: file handle is NULL in BinaryRecordIterator constructor", testing::internal::GetCapturedStdout());
    EXPECT_FALSE(iterator.IsOK());
    EXPECT_EQ(3, iterator.GetStatus());
    EXPECT_EQ(0.0, iterator.Next());
    EXPECT_EQ(3, iterator.Rewind());
}

TEST(BinaryRecordIterator, FailedReadStillHandsOutTheValuesReadAhead)
{
    const TempDir directory;
    const std::vector<double> values(20000, 1.5); // more than a block
    WriteFile(directory.File("f"), values);
    FaultyPlatform platform;
    platform.fFailingCall = 3; // open, first block, second block
    BinaryRecordIterator iterator(directory.File("f"), &platform);

    EXPECT_LT(ReadAll(iterator).size(), values.size());
    EXPECT_EQ(3, iterator.GetStatus());
    EXPECT_EQ(0.0, iterator.Next());
    EXPECT_EQ(0, iterator.Rewind());
    EXPECT_EQ(values, ReadAll(iterator));
}

TEST(RecordBuffer, IsFullWithItsFirstFullRow)
{
    BINRecordBuffer buffer;
    EXPECT_FALSE(buffer.Init(-1, 2));
    EXPECT_FALSE(buffer.Init(std::numeric_limits<int>::max(), std::numeric_limits<int>::max()));
    ASSERT_TRUE(buffer.Init(2, 2));

    EXPECT_FALSE(buffer.Append(2, 1.0));
    EXPECT_FALSE(buffer.Append(-1, 1.0));
    EXPECT_TRUE(buffer.Append(1, 7.0));
    EXPECT_FALSE(buffer.IsFull());
    EXPECT_TRUE(buffer.Append(1, 8.0));
    EXPECT_TRUE(buffer.IsFull());
    EXPECT_FALSE(buffer.Append(1, 9.0)) << "would stand in the next row";
    EXPECT_EQ(0, buffer.RowFill(0));
    EXPECT_EQ(8.0, buffer.RowData(1)[1]);
    EXPECT_EQ(nullptr, buffer.RowData(2));
    buffer.Reset();
    EXPECT_FALSE(buffer.IsFull());
    EXPECT_EQ(0, buffer.RowFill(1));
}

TEST(RecordFiles, NamesAreConsecutiveTicksThatNothingBears)
{
    TestFiles t;
    t.fPlatform.fTick = 0xabc;
    WriteFile(t.fDirectory.File("abd"), {42.0});

    ASSERT_TRUE(t.fFiles.Init(2).IsOK());

    EXPECT_EQ((std::vector<std::string>{t.fDirectory.File("abc"), t.fDirectory.File("abe")}), t.fFiles.GetNames());
    EXPECT_EQ(std::vector<std::string>{"abd"}, t.fDirectory.FileNames()) << "no file comes into being yet";
}

TEST(RecordFiles, NamesDontFollowTheLocaleOfTheProgram)
{
    const GroupedDigitsEverywhere german;
    TestFiles t;
    t.fPlatform.fTick = 0x1234567890;

    ASSERT_TRUE(t.fFiles.Init(1).IsOK());

    EXPECT_EQ(t.fDirectory.File("1234567890"), t.fFiles.GetNames().front());
}

TEST(RecordFiles, DirectoryIsJoinedWithASlashUnlessItEndsInASeparator)
{
    for (const std::string& end : {std::string(), std::string("/"), std::string("/x\\")})
    {
        TestFiles t(nullptr, end);
        ASSERT_TRUE(t.fFiles.Init(1).IsOK());
        EXPECT_EQ(t.fDirectory.Path() + (end.empty() ? "/" : end) + "1", t.fFiles.GetNames().front());
    }
}

TEST(RecordFiles, CancelEndsTheNamingButNotTheSearchForAName)
{
    CancelAfter query(1);
    TestFiles t(&query);
    for (const char* taken : {"1", "2"}) WriteFile(t.fDirectory.File(taken), {});

    EXPECT_EQ(MCBinning::MCStatus(MCBinning::BINStatusCancelled, false), t.fFiles.Init(2));

    EXPECT_EQ(std::vector<std::string>(2), t.fFiles.GetNames());
    EXPECT_EQ(1, query.fNumAsked) << "the flag is up: the host is not asked again";
}

TEST(RecordFiles, EachFlushAppendsAndTheFilesGoWithTheObject)
{
    TempDir directory;
    {
        BINCancelMonitor monitor(nullptr);
        RecordFiles files(directory.Path(), &monitor, SystemPlatform());
        ASSERT_TRUE(files.Init(2).IsOK());
        files.Append(0, 1.5);
        ASSERT_TRUE(files.Flush().IsOK());
        files.Append(0, 2.5);
        ASSERT_TRUE(files.Flush().IsOK());

        EXPECT_EQ((std::vector<double>{1.5, 2.5}), ValuesOf(files.GetNames()[0]));
        EXPECT_EQ(std::vector<double>{}, ValuesOf(files.GetNames()[1])) << "a file without a value";
        EXPECT_EQ(2U, files.GetSpoolFiles()[0].fNumValues);
        EXPECT_EQ(2U, directory.FileNames().size());
    }
    EXPECT_TRUE(directory.IsEmpty());
}
