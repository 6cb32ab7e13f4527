// Results of single pairs, as those of one run of all.

#include "bins/gather.h"

#include "tests/support/samplebins.h"

#include <gtest/gtest.h>

using MCBinning::MCStatus;

namespace
{

/// The run of one pair, which ended so.
Bins PartOf(const MCStatus& status)
{
    Bins part;
    part.componentVersion = "1.0";
    part.variables = {AVariable("x"), AVariable("t", VariableKind::kStringCategorical, {"a", "b"})};
    part.status = status.IsOK() ? MCStatus() : MCStatus(MCBinning::BINStatusSomeResultsFlagged, true);
    part.results = {SomeBins(part.variables[0], part.variables[1], {2.5}, {{1, 2}, {3, 4}})};
    part.results[0].status = status;
    part.results[0].numDistinct = 6;
    return part;
}

MCStatus About(MCBinning::BINStatusCode code, long index)
{
    MCStatus status(code, true);
    status.SetDiscreteDatum(0, index);
    return status;
}

} // namespace

TEST(Gather, StatusesNameTheVariablesOfTheWhole)
{
    struct Case
    {
        MCStatus ofPart;
        MCStatus ofWhole;
    };
    const Case cases[] = {
        {MCStatus(), MCStatus()},
        {MCStatus(MCBinning::BINStatusNoCutPoints, true), MCStatus(MCBinning::BINStatusNoCutPoints, true)},
        {About(MCBinning::BINStatusSingleValueAttribute, 0), About(MCBinning::BINStatusSingleValueAttribute, 3)},
        {About(MCBinning::BINStatusNoEFCutPoints, 0), About(MCBinning::BINStatusNoEFCutPoints, 3)},
        {About(MCBinning::BINStatusSingleCategoryTarget, 1), About(MCBinning::BINStatusSingleCategoryTarget, 1)},
        {About(MCBinning::BINStatusTooManyCategories, 0), About(MCBinning::BINStatusTooManyCategories, 3)},
    };
    for (const Case& c : cases)
    {
        Bins whole;
        whole.variables = {AVariable("w", VariableKind::kWeight), AVariable("t"), AVariable("y"), AVariable("x")};
        AddPart(whole, PartOf(c.ofPart), 3, 1, std::nullopt);
        ASSERT_EQ(1u, whole.results.size());
        EXPECT_TRUE(c.ofWhole == whole.results[0].status) << c.ofWhole.GetErrorCode();
        EXPECT_EQ(whole.variables[3], whole.results[0].attribute);
        EXPECT_EQ(whole.variables[1], whole.results[0].target);
        EXPECT_EQ(6, whole.results[0].numDistinct);
    }
}

TEST(Gather, AFlagStaysBehindPartsThatAreFineAndAFailureBehindAll)
{
    Bins whole;
    whole.variables = {AVariable("x"), AVariable("t")};
    AddPart(whole, PartOf(MCStatus(MCBinning::BINStatusNoCutPoints, true)), 0, 1, 1000);
    AddPart(whole, PartOf(MCStatus()), 0, -1, std::nullopt);
    EXPECT_EQ(MCBinning::BINStatusSomeResultsFlagged, whole.status.GetErrorCode());
    EXPECT_EQ("1.0", whole.componentVersion);
    EXPECT_EQ(1000, whole.results[0].numDistinct);
    EXPECT_EQ(nullptr, whole.results[1].target);

    Bins failed = PartOf(MCStatus());
    failed.results.clear();
    failed.status = MCStatus(MCBinning::BINStatusCannotOpenTempFile, false);
    AddPart(whole, failed, 0, 1, std::nullopt);
    AddPart(whole, PartOf(MCStatus(MCBinning::BINStatusNoCutPoints, true)), 0, 1, std::nullopt);
    EXPECT_EQ(MCBinning::BINStatusCannotOpenTempFile, whole.status.GetErrorCode());
    EXPECT_EQ(3u, whole.results.size());
}
