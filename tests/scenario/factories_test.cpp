#include "tests/support/runs.h"

#include <gtest/gtest.h>

#include <functional>
#include <memory>

using MCBinning::MCStatus;

namespace
{

MCStatus InvalidList(int variable)
{
    MCStatus status(MCBinning::BINStatusInvalidVarList, false);
    status.SetDiscreteDatum(1, variable);
    return status;
}

} // namespace

TEST(Factories, RefuseListsAndNameTheVariable)
{
    struct Case
    {
        const char* fWhat;
        BINVarList fList;
        int fCulprit;
    };
    std::vector<Case> cases{
        {"empty", BINVarList(), -1},
        {"no attribute", AVarList().WithTarget("t", 2), -1},
        {"one category", AVarList().WithAttribute("x").WithCategorical("c", 1), 1},
        {"none before one", AVarList().WithCategorical("c", 1).WithAttribute("x").WithTarget("t", 0), 2},
        {"two targets", AVarList().WithAttribute("x").WithTarget("t", 2).WithTarget("u", 2), 1}};
    const auto add = [&](const char* what, int culprit, const std::function<void(BINVarList&)>& spoil)
    {
        cases.push_back(
            {what, AVarList().WithAttribute("x").WithWeight().WithAttribute("y").WithTarget("t", 2), culprit});
        spoil(cases.back().fList);
    };
    add("undefined role", 2, [](BINVarList& list) { list.SetVariableRole(2, IBINVariable::RoleUndefined); });
    add("role of no name", 0,
        [](BINVarList& list) { list.SetVariableRole(0, static_cast<IBINVariable::VariableRole>(9)); });
    add("target index on an attribute", 3,
        [](BINVarList& list) { list.GetVarAt(3)->SetVariableRole(IBINVariable::RoleAttribute); });
    add("target that the list doesn't know", 0,
        [](BINVarList& list) { list.GetVarAt(0)->SetVariableRole(IBINVariable::RoleTarget); });
    add("second weight", 2,
        [](BINVarList& list) { list.GetVarAt(2)->SetVariableRole(IBINVariable::RoleFrequencyWeight); });
    add("target index on the weight", 1,
        [](BINVarList& list)
        {
            list.RemoveVar(3);
            list.SetVariableRole(1, IBINVariable::RoleTarget);
        });
    BINSettings settings;
    EFBINSettings efSettings;
    for (Case& c : cases)
    {
        SCOPED_TRACE(c.fWhat);
        BINFactory factory;
        EFBINFactory efFactory;
        EXPECT_EQ(nullptr, factory.CreateBINAlgorithm(settings, c.fList));
        EXPECT_EQ(InvalidList(c.fCulprit), factory.GetStatus());
        EXPECT_EQ(nullptr, efFactory.CreateEFBINAlgorithm(efSettings, c.fList));
        EXPECT_EQ(InvalidList(c.fCulprit), efFactory.GetStatus());
    }
}

TEST(Factories, ServeAgainAfterARefusalAndOutliveNothing)
{
    auto factory = std::make_unique<BINFactory>();
    BINSettings settings = SupervisedSettings();
    BINVarList list = AVarList().WithTarget("t", 2);
    EXPECT_EQ(nullptr, factory->CreateBINAlgorithm(settings, list));
    BINFactory copy(*factory);
    list.AddContVar("x", "", IBINVariable::RoleAttribute);

    std::unique_ptr<IBINAlgorithm> algorithm(factory->CreateBINAlgorithm(settings, list));

    ASSERT_NE(nullptr, algorithm);
    EXPECT_TRUE(factory->GetStatus().IsOK());
    EXPECT_EQ(InvalidList(-1), copy.GetStatus());
    factory.reset();
    RecordTable records{{0, 1}, {1, 2}};
    EXPECT_FALSE(algorithm->Run(&records, nullptr, nullptr).IsError());
}

TEST(Factories, CancelAtCreationGivesNoAlgorithm)
{
    CancelAfter query(1);
    EFBINSettings settings = EqualFrequencySettings(2);
    settings.SetCancelPointer(&query);
    BINVarList list = AVarList().WithAttribute("x");
    EFBINFactory factory;

    EXPECT_EQ(nullptr, factory.CreateEFBINAlgorithm(settings, list));
    EXPECT_EQ(MCStatus(MCBinning::BINStatusCancelled, false), factory.GetStatus());
}
