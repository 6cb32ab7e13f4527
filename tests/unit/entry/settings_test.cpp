#include <mcobnqrt/binsettings.h>
#include <mcobnqrt/efbinsettings.h>

#include "platform/platform.h"
#include "tests/support/tempdir.h"

#include <gtest/gtest.h>

#include <cstdlib>
#include <fstream>
#include <limits>
#include <map>
#include <optional>
#include <sstream>

/// What the settings of both kinds of run have in common.
template<class Settings>
class SettingsOfBothKinds : public testing::Test
{
};

using BothKinds = testing::Types<BINSettings, EFBINSettings>;
TYPED_TEST_SUITE(SettingsOfBothKinds, BothKinds, ); // the empty argument is for pedantic compilers

TYPED_TEST(SettingsOfBothKinds, KeepTheFormerValueWhereTheyRefuse)
{
    TypeParam settings;

    EXPECT_FALSE(settings.SetNumberOfBins(0) || settings.SetNumberOfBins(1));
    EXPECT_FALSE(settings.SetNSkippedAttReports(-1) || settings.SetNSkippedCasesReports(-1));
    EXPECT_TRUE(settings == TypeParam());

    EXPECT_TRUE(settings.SetNumberOfBins(2));
    EXPECT_TRUE(settings.SetNSkippedAttReports(3) && settings.SetNSkippedAttReports(0));
    EXPECT_TRUE(settings.SetNSkippedCasesReports(0));
    EXPECT_EQ(2, settings.GetNumberOfBins());
    EXPECT_EQ(0, settings.GetNSkippedAttReports());
    EXPECT_EQ(0, settings.GetNSkippedCasesReports());
}

TYPED_TEST(SettingsOfBothKinds, DifferByFourFiguresAndNotByTheDirectory)
{
    TypeParam plain, directory, attributes, cases, border, bins;
    EXPECT_EQ(SystemTempDirectory(), plain.GetTempDirName());

    directory.SetTempDirName("");
    attributes.SetNSkippedAttReports(1);
    cases.SetNSkippedCasesReports(1);
    border.SetRightBorderClosed(false);
    bins.SetNumberOfBins(10);

    EXPECT_TRUE(directory == plain);
    for (const TypeParam& other : {attributes, cases, border, bins}) EXPECT_FALSE(other == plain);
}

TYPED_TEST(SettingsOfBothKinds, TakeTheDirectoryOfTheEnvironmentIfFilesCanBeMadeThere)
{
    const char* const inherited = std::getenv("TMPDIR");
    const std::optional<std::string> former = inherited != nullptr ? std::optional(inherited) : std::nullopt;
    const TempDir directory;
    std::ofstream(directory.File("file")) << "no directory";
    std::map<std::string, std::string> found;

    const std::vector<std::string> values{directory.Path() + "//", directory.File("none"), directory.File("file"), ""};
    for (const std::string& value : values)
    {
        setenv("TMPDIR", value.c_str(), 1);
        found[value] = TypeParam().GetTempDirName();
    }
    unsetenv("TMPDIR");
    const std::string withoutVariable = TypeParam().GetTempDirName();
    if (former)
        setenv("TMPDIR", former->c_str(), 1);

    EXPECT_EQ(directory.Path(), found[values.front()]);
    for (std::size_t i = 1; i < values.size(); ++i) EXPECT_EQ("/tmp", found[values[i]]) << values[i];
    EXPECT_EQ("/tmp", withoutVariable);
}

TEST(SupervisedSettings, RefuseAThresholdOutOfRange)
{
    BINSettings settings;
    EXPECT_TRUE(settings.SetSmallBinDetectionThreshold(0.0) && settings.SetSmallBinDetectionThreshold(1.0));
    for (double refused : {1.5, -0.1, std::numeric_limits<double>::quiet_NaN()})
        EXPECT_FALSE(settings.SetSmallBinDetectionThreshold(refused)) << refused;
    EXPECT_EQ(1.0, settings.GetSmallBinDetectionThreshold());
    EXPECT_TRUE(settings == BINSettings());

    EXPECT_TRUE(settings.SetNumDistinctValueThreshold(0));
    EXPECT_FALSE(settings.SetNumDistinctValueThreshold(-1)); // the default, which can't be set again
    EXPECT_FALSE(settings == BINSettings());
}

TEST(Settings, DisplayTheirFiguresWithTheClosedBorderUnlabelledForEqualFrequency)
{
    std::ostringstream supervised, equalFrequency;
    BINSettings().Display(supervised);
    EFBINSettings().Display(equalFrequency);

    EXPECT_EQ("\nStart of BINSettings display\n"
              "Number of progress reports to skip when create bins for attribute = 0\n"
              "Number of progress reports to skip when read data file = 100000\n"
              "if use EF as proprecess = 1\nNumber of distinct value = -1\nNumber of bins for EF = -1\n"
              "End of BINSettings display\n",
              supervised.str());
    EXPECT_EQ("\nStart of EFBINSettings display\n"
              "Number of progress reports to skip when create bins for attribute = 0\n"
              "Number of progress reports to skip when read data file = 100000\n"
              "1\nNumber of bins for EF = -1\n"
              "End of EFBINSettings display\n",
              equalFrequency.str());
}
