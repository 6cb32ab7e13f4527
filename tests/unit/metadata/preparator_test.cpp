#include <gtest/gtest.h>

#include "support/preparatorpeer.h"

#include <sstream>

TEST(RecordLayout, PositionsAreTargetWeightAttributes)
{
    struct Case
    {
        BINVarList fList;
        std::vector<int> fPositions;
        std::vector<int> fInputs;
        int fWeightNewIndex;
    };
    const std::vector<Case> cases{
        {AVarList().WithAttribute("a").WithWeight().WithTarget("t", 2).WithAttribute("b"), {2, 1, 0, 3}, {0, 3}, 1},
        {AVarList().WithAttribute("a").WithWeight(), {1, 0}, {0}, 1},
        {AVarList().WithAttribute("a").WithTarget("t", 2), {1, 0}, {0}, -1},
        {AVarList().WithAttribute("a").WithCategorical("b", 2), {0, 1}, {0, 1}, -1},
    };
    for (const Case& c : cases)
    {
        SCOPED_TRACE(testing::PrintToString(c.fPositions));
        BINDataPreparatorPeer preparator(c.fList);
        EXPECT_EQ(c.fPositions, preparator->GetVariableIndex());
        EXPECT_EQ(c.fInputs, preparator.InputIndices());
        EXPECT_EQ(c.fWeightNewIndex, preparator.WeightNewIndex());
    }
}

TEST(RecordLayout, PositionsThatThereAreNotAreRefused)
{
    BINDataPreparatorPeer preparator(AVarList().WithAttribute("a").WithTarget("t", 2));
    for (const int position : {-1, 2})
    {
        bool isUsable = true;
        EXPECT_EQ(MCBinning::MCStatus(MCBinning::BINStatusIndexOutOfRange, false),
                  preparator->IsVariableUsable(position, &isUsable));
        EXPECT_TRUE(isUsable);
    }
    EXPECT_TRUE(preparator.IsUsable(1));
}

TEST(RecordLayout, DisplayIsToTheLetter)
{
    BINVarList list = AVarList().WithAttribute("a").WithWeight().WithTarget("t", 2);
    BINDataPreparatorPeer preparator(list);
    std::ostringstream shown;
    std::ostringstream shownList;

    preparator->Display(shown);

    list.Display(shownList);
    EXPECT_EQ("BINDataPreparator object: \n"
              "\tPossible inputs used? \tOriginal record size = 3\n"
              "\tProcessed record size = 3\n"
              "\tInput-only record size = 1\n"
              "\tFrequency weight original and new indices: 1   1\n"
              "\tVariable index: 2 1 0 \n"
              "\tIndices of input variables in the variable list: 0 \n"
              "\tVariable measurement levels: 1 4 3 \n"
              "\tVariable roles: 1 3 2 \n"
              "\n"
              "\tStatus is OK.\n" +
                  shownList.str(),
              shown.str());
}
