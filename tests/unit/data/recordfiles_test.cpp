#include "data/binaryrecorditerator.h"
#include "data/binrecordbuffer.h"
#include "support/groupeddigits.h"
#include "support/preparatorpeer.h"

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

BINVarList TwoAttributes()
{
    return AVarList().WithAttribute("a").WithAttribute("b");
}

} // namespace

TEST(BinaryRecordIterator, GivesEachValueOnceAndAgainAfterRewind)
{
    const TempDir directory;
    // The third has half a value at its end, which is none.
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

TEST(TempFiles, NamesAreConsecutiveTicksThatNothingBears)
{
    BINDataPreparatorPeer preparator(TwoAttributes());
    preparator.fPlatform.fTick = 0xabc;
    WriteFile(preparator.fDirectory.File("abd"), {42.0});

    ASSERT_TRUE(preparator->InitTempFiles().IsOK());

    EXPECT_EQ((std::vector<std::string>{preparator.fDirectory.File("abc"), preparator.fDirectory.File("abe")}),
              preparator->GetFileNames());
    EXPECT_EQ(std::vector<std::string>{"abd"}, preparator.fDirectory.FileNames()) << "no file comes into being yet";
}

TEST(TempFiles, NamesDontFollowTheLocaleOfTheProgram)
{
    const GroupedDigitsEverywhere german;
    BINDataPreparatorPeer preparator(AVarList().WithAttribute("a"));
    preparator.fPlatform.fTick = 0x1234567890;

    ASSERT_TRUE(preparator->InitTempFiles().IsOK());

    EXPECT_EQ(preparator.fDirectory.File("1234567890"), preparator->GetFileNames().front());
}

TEST(TempFiles, DirectoryIsJoinedWithASlashUnlessItEndsInASeparator)
{
    const TempDir directory;
    for (const std::string& end : {std::string(), std::string("/"), std::string("/x\\")})
    {
        BINVarList list = AVarList().WithAttribute("a");
        BINCancelMonitor monitor(nullptr);
        FaultyPlatform platform;
        platform.fTick = 1;
        BINDataPreparator preparator(&list, &monitor, directory.Path() + end, nullptr, 0, &platform);
        ASSERT_TRUE(preparator.InitTempFiles().IsOK());
        EXPECT_EQ(directory.Path() + (end.empty() ? "/" : end) + "1", preparator.GetFileNames().front());
    }
}

TEST(TempFiles, CancelEndsTheNamingButNotTheSearchForAName)
{
    CancelAfter query(1);
    BINDataPreparatorPeer preparator(TwoAttributes(), nullptr, 0, &query);
    preparator.fPlatform.fTick = 1;
    for (const char* taken : {"1", "2"}) WriteFile(preparator.fDirectory.File(taken), {});

    EXPECT_EQ(MCBinning::MCStatus(MCBinning::BINStatusCancelled, false), preparator->InitTempFiles());

    EXPECT_EQ(std::vector<std::string>(2), preparator->GetFileNames());
    EXPECT_EQ(1, query.fNumAsked) << "the flag is up: the host is not asked again";
}
