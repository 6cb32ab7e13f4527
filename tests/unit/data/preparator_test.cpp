#include "metadata/recordlayout.h"
#include "tests/support/testpreparator.h"

#include <gtest/gtest.h>

#include <sstream>

TEST(RecordLayout, PositionsAreTargetWeightAttributes)
{
    struct Case
    {
        BINVarList fList;
        std::vector<int> fPositions;
        std::vector<int> fInputs;
        int fFirstAttribute;
    };
    const std::vector<Case> cases{
        {AVarList().WithAttribute("a").WithWeight().WithTarget("t", 2).WithAttribute("b"), {2, 1, 0, 3}, {0, 3}, 2},
        {AVarList().WithAttribute("a").WithWeight(), {1, 0}, {0}, 1},
        {AVarList().WithAttribute("a").WithTarget("t", 2), {1, 0}, {0}, 1},
        {AVarList().WithAttribute("a").WithCategorical("b", 2), {0, 1}, {0, 1}, 0},
    };
    for (const Case& c : cases)
    {
        SCOPED_TRACE(testing::PrintToString(c.fPositions));
        const RecordLayout layout(c.fList);
        EXPECT_EQ(c.fPositions, layout.GetPositions());
        EXPECT_EQ(c.fInputs, layout.GetAttributes());
        EXPECT_EQ(c.fFirstAttribute, layout.GetFirstAttributePosition());
        EXPECT_EQ(static_cast<int>(c.fPositions.size()), layout.GetNumPositions());
        EXPECT_EQ(-1, layout.PositionOf(-1));
        EXPECT_EQ(-1, layout.PositionOf(layout.GetNumVariables()));
    }
}

TEST(Preparator, PositionsThatThereAreNotAreRefused)
{
    TestPreparator preparator(AVarList().WithAttribute("a").WithTarget("t", 2));
    for (const int position : {-1, 2})
    {
        bool isUsable = true;
        EXPECT_EQ(MCBinning::MCStatus(MCBinning::BINStatusIndexOutOfRange, false),
                  preparator->IsVariableUsable(position, &isUsable));
        EXPECT_TRUE(isUsable);
    }
    EXPECT_TRUE(preparator.IsUsable(1));
}

TEST(Preparator, DisplayIsToTheLetter)
{
    BINVarList list = AVarList().WithAttribute("a").WithWeight().WithTarget("t", 2);
    TestPreparator preparator(list);
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
