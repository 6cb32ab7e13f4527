#include "metadata/recordlayout.h"
#include "tests/support/hostdata.h"

#include <mcobnqrt/bincatnumencoder.h>
#include <mcobnqrt/bincontvar.h>
#include <mcobnqrt/binnumericusermissing.h>
#include <mcobnqrt/binstringencoder.h>
#include <mcobnqrt/binstringusermissing.h>
#include <mcobnqrt/binvarlist.h>

#include <gtest/gtest.h>

#include <memory>
#include <sstream>
#include <stdexcept>
#include <string>
#include <vector>

namespace
{

constexpr auto kAttribute = IBINVariable::RoleAttribute;
constexpr auto kTarget = IBINVariable::RoleTarget;
constexpr auto kWeight = IBINVariable::RoleFrequencyWeight;
constexpr auto kStrings = IBINVariable::MeasureStringCategorical;
const std::vector<std::string> kYesNo{"yes", "no"};

/// age (0), region (1), weight (2) and the target, bought (3).
BINVarList AList()
{
    BINVarList list;
    list.AddContVar("age", "Age", kAttribute);
    list.AddCatVar("region", "Region", std::vector<double>{4.0, 2.0}, {"north", "south"}, kAttribute);
    list.AddWeightVar("weight", "", IBINVariable::RoundClosest);
    list.AddCatVar("bought", "", kYesNo, kTarget);
    return list;
}

std::string Shown(const BINVarList& list)
{
    std::ostringstream os;
    list.Display(os);
    return os.str();
}

void EncodeTarget(BINVarList& list, const char* value)
{
    static_cast<BINStringEncoder*>(list.GetEncoderAt(3))->Encode(value);
}

} // namespace

TEST(VarList, AddedCategoriesAreEncodedAndLabelledInTheirOrder)
{
    const BINVarList list = AList();

    const auto* region = static_cast<const BINCatNumEncoder*>(list.GetEncoderAt(1));
    EXPECT_EQ(2.0, region->Decode(1));
    EXPECT_EQ("south", region->GetValueLabels()->at(1));
    EXPECT_EQ("no", static_cast<const BINStringEncoder*>(list.GetEncoderAt(3))->Decode(1));
}

TEST(VarList, ARefusedCallChangesNothing)
{
    BINVarList list = AList();
    const std::string before = Shown(list);

    EXPECT_EQ(-1, list.AddContVar("", "", kAttribute));
    EXPECT_EQ(-1, list.AddContVar("weight", "", kAttribute));
    EXPECT_EQ(-1, list.AddContVar("x", "", kTarget));
    EXPECT_EQ(-1, list.AddContVar("x", "", kWeight));
    EXPECT_EQ(-1, list.AddCatVar("age", "", 2, kStrings, kTarget));
    EXPECT_EQ(-1, list.AddCatVar("x", "", 2, kStrings, kWeight));
    EXPECT_EQ(-1, list.AddCatVar("age", "", kYesNo, kTarget));
    EXPECT_EQ(-1, list.AddCatVar("x", "", std::vector<double>{1.0}, {"one"}, kTarget));
    EXPECT_EQ(-1, list.AddWeightVar("w2", "", IBINVariable::RoundTruncate));
    EXPECT_THROW(list.AddCatVar("x", "", -1, kStrings, kTarget), std::length_error);
    EXPECT_FALSE(list.SetVariableRole(3, kWeight) || list.SetVariableRole(4, kTarget));
    EXPECT_FALSE(list.RemoveVar(-1) || list.RemoveVar(4) || list.RemoveVar("Weight"));
    EXPECT_FALSE(list.AddDiscreteUserMissing(4, 1.0, "") || list.AddDiscreteUserMissing(-1, "x", ""));
    EXPECT_TRUE(!list.GetVarAt(4) && !list.GetEncoderAt(-1) && !list.GetEncoderAt(0));

    EXPECT_EQ(before, Shown(list));
    EXPECT_EQ(2, list.GetWeightIndex());
    EXPECT_EQ(4, list.AddContVar("Age", "", kAttribute));
}

TEST(VarList, ASecondTargetTakesTheIndexWhenAddedButNotWhenARoleIsSet)
{
    BINVarList list = AList();
    ASSERT_TRUE(list.SetVariableRole(0, kTarget));
    EXPECT_EQ(3, list.GetTargetIndex());
    EXPECT_EQ(4, list.AddCatVar("paid", "", 5, kStrings, kTarget));

    std::vector<std::string> attributes{"stale"};
    std::string target;
    list.GetVarNames(attributes, target);
    EXPECT_EQ(4, list.GetTargetIndex());
    EXPECT_EQ(std::vector<std::string>{"region"}, attributes);
    EXPECT_EQ("paid", target);

    // No successor, though two variables still have the role and the index named one of them.
    BINVarList shorter(list);
    ASSERT_TRUE(shorter.RemoveVar(0));
    EXPECT_EQ(-1, shorter.GetTargetIndex());
    ASSERT_TRUE(list.SetVariableRole(0, kAttribute));
    EXPECT_EQ(-1, list.GetTargetIndex());
    EXPECT_EQ(nullptr, list.GetTargetVariable());
    EXPECT_EQ(2, list.GetNTargetCats()) << "of bought, the first by role";
}

TEST(VarList, IndicesFollowTheirVariablesOnRemoval)
{
    BINVarList list = AList();
    ASSERT_TRUE(list.RemoveVar("age"));
    EXPECT_TRUE(list.GetTargetIndex() == 2 && list.GetWeightIndex() == 1);
    ASSERT_TRUE(list.RemoveVar(1));
    EXPECT_TRUE(list.GetTargetIndex() == 1 && list.GetWeightIndex() == -1);
    EXPECT_TRUE(list.GetNumContVar() == 0 && list.GetNumCatVar() == 2);
    EXPECT_EQ(2, list.AddWeightVar("", "", IBINVariable::RoundTruncate));

    ASSERT_TRUE(list.RemoveVar("bought"));
    EXPECT_TRUE(list.GetTargetIndex() == -1 && list.GetWeightIndex() == 1);

    // The weight can be named by the target index, but it keeps its role.
    ASSERT_TRUE(list.SetVariableRole(1, kTarget));
    EXPECT_EQ(kWeight, list.GetVariableRole(1));
    EXPECT_EQ(1, FindVariableWithoutPosition(list));
    ASSERT_TRUE(list.RemoveVar(1));
    EXPECT_EQ(1, list.GetTargetIndex());
    EXPECT_EQ(nullptr, list.GetTargetVariable());
    EXPECT_EQ(1, FindVariableWithoutPosition(list));
}

TEST(VarList, UserMissingValuesAndOneIntervalMeetInOneObject)
{
    BINVarList list = AList();
    for (const int index : {0, 1, 2})
    {
        EXPECT_TRUE(list.AddDiscreteUserMissing(index, 7.0, "before"));
        EXPECT_TRUE(list.SetMissingInterval(index, 10.0, 20.0));
        EXPECT_TRUE(list.AddDiscreteUserMissing(index, 8.0, "after"));
        EXPECT_FALSE(list.SetMissingInterval(index, 30.0, 40.0));
        EXPECT_FALSE(list.AddDiscreteUserMissing(index, "x", "")) << index;

        const auto* missing = static_cast<const BINNumericUserMissing*>(list.GetVarAt(index)->GetUserMissingInfo());
        EXPECT_EQ((std::vector<double>{7.0, 8.0}), missing->GetDiscreteValues());
        EXPECT_TRUE(*missing->GetInterval() == BINNumericInterval(10.0, 20.0));
    }
    EXPECT_TRUE(list.AddDiscreteUserMissing(3, "yes", ""));
    EXPECT_FALSE(list.AddDiscreteUserMissing(3, 1.0, "") || list.SetMissingInterval(3, 1.0, 2.0));
    EXPECT_EQ(-1.0, static_cast<BINStringEncoder*>(list.GetEncoderAt(3))->Encode("yes"));
}

TEST(VarList, AVariableWithStringsUnderAnotherLevelTakesNoNumbers)
{
    BINVarList list;
    list.AddCatVar("v", "", 2, IBINVariable::MeasureUnknown, kAttribute);
    EXPECT_FALSE(list.AddDiscreteUserMissing(0, 1.0, ""));
    EXPECT_EQ(nullptr, list.GetVarAt(0)->GetUserMissingInfo());

    ASSERT_TRUE(list.GetVarAt(0)->SetUserMissingInfo(std::make_unique<BINStringUserMissing>().release()));
    EXPECT_FALSE(list.AddDiscreteUserMissing(0, 1.0, "") || list.SetMissingInterval(0, 1.0, 2.0));
    EXPECT_EQ(0, list.GetVarAt(0)->GetUserMissingInfo()->GetNDiscreteValues());
}

TEST(VarList, IsValidWithAnAttributeAndEnoughCategoriesEverywhere)
{
    std::vector<int> one{9}, none{9};
    BINVarList list;
    list.AddCatVar("bought", "", kYesNo, kTarget);
    EXPECT_FALSE(list.IsValidList(one, none));
    EXPECT_TRUE(one.empty() && none.empty());

    list.AddContVar("age", "", kAttribute);
    EXPECT_TRUE(list.IsValidList(one, none));

    list.AddCatVar("few", "", 1, kStrings, kAttribute);
    list.AddCatVar("empty", "", 0, IBINVariable::MeasureNumericCategorical, IBINVariable::RoleUndefined);
    EXPECT_FALSE(list.IsValidList(one, none));
    EXPECT_EQ(std::vector<int>{2}, one);
    EXPECT_EQ(std::vector<int>{3}, none);
}

TEST(VarList, MergeNamesTheFirstDifference)
{
    const struct
    {
        const char* what;
        void (*change)(BINVarList&);
        int badIndex; ///< 77, the value before the call, where the lists can merge
    } cases[] = {
        {"nothing", [](BINVarList&) {}, 77},
        {"size", [](BINVarList& list) { list.RemoveVar(3); }, 3},
        {"target index", [](BINVarList& list) { list.SetVariableRole(3, kAttribute); }, -1},
        {"label", [](BINVarList& list) { list.GetVarAt(2)->SetVariableLabel("Weight"); }, 2},
        {"missing weight", [](BINVarList& list) { list.AddDiscreteUserMissing(2, 1.0, ""); }, 77},
        {"missing value", [](BINVarList& list) { list.AddDiscreteUserMissing(1, 1.0, ""); }, 1},
        {"count behind its encoder", [](BINVarList& list) { EncodeTarget(list, "perhaps"); }, 3},
        {"categories", [](BINVarList& list) { EncodeTarget(list, "perhaps"), list.UpdateNumbersOfCategories(); }, 77},
    };

    for (const auto& c : cases)
    {
        const BINVarList list = AList();
        BINVarList changed = AList();
        c.change(changed);
        int thisWay = 77, thatWay = 77;

        EXPECT_EQ(c.badIndex == 77, list.CanMergeWith(changed, thisWay)) << c.what;
        EXPECT_EQ(c.badIndex == 77, changed.CanMergeWith(list, thatWay)) << c.what;
        EXPECT_TRUE(thisWay == c.badIndex && thatWay == c.badIndex) << c.what;
    }
}

TEST(VarList, CopiesShareNothing)
{
    BINVarList source = AList();
    BINVarList copy;
    copy.AddContVar("old", "", kAttribute);
    copy = source;
    const std::string before = Shown(copy);

    EncodeTarget(source, "perhaps");
    source.AddDiscreteUserMissing(1, 4.0, "");
    source.RemoveVar(0);

    EXPECT_EQ(before, Shown(copy));
    EXPECT_TRUE(copy.GetTargetIndex() == 3 && copy.GetWeightIndex() == 2);
}

TEST(VarList, NamesAreFoundWhateverIsAddedRemovedCopiedOrAssigned)
{
    constexpr unsigned int kSeed = 7;
    SCOPED_TRACE(kSeed);
    Dice dice(kSeed);
    const std::vector<std::string> names{"a", "b", "c", "d", "e", "f"};
    const auto anyName = [&] { return names[static_cast<std::size_t>(dice.Below(6))]; };
    BINVarList list;
    const auto findPlainly = [&list](const std::string& name)
    {
        for (int i = 0; i < static_cast<int>(list.Size()); ++i)
        {
            if (list.GetVarAt(i)->GetVariableName() == name)
                return i;
        }
        return -1;
    };
    int numAssigned = 0;
    int numAddedAfterAssignment = 0;

    for (int step = 0; step < 2000; ++step)
    {
        const std::string name = anyName();
        const bool isKnown = findPlainly(name) >= 0;
        const int index = dice.Below(7);
        switch (dice.Below(8))
        {
        case 0:
            list.AddWeightVar(name, "", IBINVariable::RoundClosest); // may bear a name that is taken
            break;
        case 1:
            list.RemoveVar(index);
            break;
        case 2:
            EXPECT_EQ(isKnown, list.RemoveVar(name));
            break;
        case 3: // behind the list's back, and two variables may then have one name
            if (auto* variable = dynamic_cast<BINContVar*>(list.GetVarAt(index)))
            {
                *variable = BINContVar(name, "", kAttribute);
                ++numAssigned;
            }
            break;
        case 4:
            list = BINVarList(list);
            break;
        default:
            ASSERT_EQ(isKnown, list.AddContVar(name, "", kAttribute) < 0) << name << " at step " << step;
            numAddedAfterAssignment += !isKnown && numAssigned > 0 ? 1 : 0;
        }
        for (const std::string& wanted : names)
            ASSERT_EQ(findPlainly(wanted), list.FindVariable(wanted)) << wanted << " at step " << step;
    }
    EXPECT_GT(numAssigned, 50);
    EXPECT_GT(numAddedAfterAssignment, 100);
}

TEST(VarList, DisplayShowsCountersThenEachVariable)
{
    BINVarList list;
    list.AddContVar("age", "", kAttribute);
    list.SetVariableRole(0, kTarget);

    EXPECT_EQ("\x08INegin display of BINVarList object.\nTotal variables: 1\nNumber of Continuous Variables = 1\n"
              "Number of Categorical Variables  = 0\nTarget Index  = 0\nVariable 0\n"
              "Continuous variable: name = age, label = , role = Target\nEnd of display for BINVarList object.\n",
              Shown(list));
}

TEST(RecordLayout, FindsTheFirstVariableWithoutAPositionOfItsOwn)
{
    BINVarList list = AList();
    EXPECT_EQ(-1, FindVariableWithoutPosition(list));
    list.SetVariableRole(1, IBINVariable::RoleUndefined);
    EXPECT_EQ(1, FindVariableWithoutPosition(list));
    list.SetVariableRole(0, kTarget);
    EXPECT_EQ(0, FindVariableWithoutPosition(list)) << "a second target";

    // The host can set a role behind the list's back.
    BINVarList misled = AList();
    misled.GetVarAt(3)->SetVariableRole(kAttribute);
    EXPECT_EQ(3, FindVariableWithoutPosition(misled)) << "the target index names an attribute";
    misled.GetVarAt(1)->SetVariableRole(kWeight);
    EXPECT_EQ(1, FindVariableWithoutPosition(misled)) << "a weight that is not the list's";
}
