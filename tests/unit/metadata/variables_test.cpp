#include <mcobnqrt/bincatvar.h>
#include <mcobnqrt/bincontvar.h>
#include <mcobnqrt/binnumericusermissing.h>
#include <mcobnqrt/binstringencoder.h>
#include <mcobnqrt/binweightvar.h>
#include <mcobnqrt/mccommon.h>

#include <gtest/gtest.h>

#include <memory>
#include <sstream>
#include <string>

namespace
{

BINCatVar ACatVar(int numberOfCategories)
{
    return {"region", "", numberOfCategories, IBINVariable::MeasureStringCategorical, IBINVariable::RoleAttribute};
}

void EncodeCategories(BINCatVar& variable, int count)
{
    for (int i = 0; i < count; ++i) static_cast<BINStringEncoder*>(variable.GetEncoder())->Encode(std::to_string(i));
}

double EncodedWeight(const BINWeightVar& variable, double weight)
{
    return static_cast<const BINRoundEncoder*>(variable.GetEncoder())->Encode(weight);
}

std::string Shown(const IBINVariable& variable)
{
    std::ostringstream os;
    variable.Display(os);
    return os.str();
}

} // namespace

TEST(CatVar, StatusGoesByTheHigherOfDeclaredAndEncodedCount)
{
    const struct
    {
        int declared, encoded, known;
        IBINVariable::VarStatus status;
    } cases[] = {
        {-3, 0, 0, IBINVariable::VarStatusNoCategories},
        {0, 1, 1, IBINVariable::VarStatusOneCategory},
        {1, 0, 1, IBINVariable::VarStatusOneCategory},
        {1, 2, 2, IBINVariable::VarStatusOK},
        {5, 3, 5, IBINVariable::VarStatusOK},
    };

    for (const auto& c : cases)
    {
        BINCatVar variable = ACatVar(0);
        EncodeCategories(variable, c.encoded);
        variable.SetNumberOfCategories(c.declared);

        EXPECT_EQ(c.declared, variable.GetNumberOfCategories());
        EXPECT_EQ(c.status, variable.GetVarStatus()) << c.declared << " declared, " << c.encoded << " encoded";
        EXPECT_EQ(c.known, variable.UpdateNumberOfCategories()) << c.declared << " declared";
    }
}

TEST(CatVar, CopiesHaveTheirOwnEncoder)
{
    BINCatVar source = ACatVar(0);
    BINCatVar assigned("other", "", 9, IBINVariable::MeasureNumericCategorical, IBINVariable::RoleTarget);
    EXPECT_EQ(IBINEncoder::EncoderTypeCatNum, assigned.GetEncoder()->GetEncoderType());
    assigned = source;
    EncodeCategories(source, 3);

    EXPECT_EQ("region", assigned.GetVariableName());
    EXPECT_EQ(IBINEncoder::EncoderTypeString, assigned.GetEncoder()->GetEncoderType());
    EXPECT_EQ(0, assigned.UpdateNumberOfCategories());
}

TEST(WeightVar, ItsEncoderBorrowsWhatItOwnsAlsoInACopy)
{
    auto source = std::make_unique<BINWeightVar>("w", "", IBINVariable::RoundTruncate);
    auto missing = std::make_unique<BINNumericUserMissing>();
    missing->AddValue(5.0, "");
    ASSERT_TRUE(source->SetUserMissingInfo(missing.release()));
    BINWeightVar copy(*source);
    BINWeightVar assigned("x", "", IBINVariable::RoundClosest);
    assigned = *source;
    source.reset();

    for (BINWeightVar* variable : {&copy, &assigned})
    {
        EXPECT_EQ("w", variable->GetVariableName());
        EXPECT_EQ(MCMV::gMissingValue, EncodedWeight(*variable, 5.0));
        EXPECT_TRUE(variable->SetUserMissingInfo(variable->GetUserMissingInfo()));
        EXPECT_EQ(MCMV::gMissingValue, EncodedWeight(*variable, 5.0));
        EXPECT_EQ(2.0, EncodedWeight(*variable, 2.9));
        EXPECT_TRUE(variable->SetUserMissingInfo(nullptr));
        EXPECT_EQ(5.0, EncodedWeight(*variable, 5.0));
    }
}

TEST(Variables, DisplayTheirRoleAndLevelInWords)
{
    EXPECT_EQ("Continuous variable: name = age, label = Age in years, role = Variable role 8\n",
              Shown(BINContVar("age", "Age in years", static_cast<IBINVariable::VariableRole>(8))));
    EXPECT_EQ("Categorical variable: name = region, label = , role = Attribute\n"
              "\tMeasurement Level = String Categorical\n"
              "\tNumber of Categories = 4\n\tBINStringEncoder object:  Last code = -1\n",
              Shown(ACatVar(4)));
    BINWeightVar weight("w", "", IBINVariable::RoundTruncate);
    ASSERT_TRUE(weight.SetUserMissingInfo(std::make_unique<BINNumericUserMissing>().release()));
    const std::string missing = "\nStart of BINNumericUserMissing display\nEnd of BINNumericUserMissing display\n";
    EXPECT_EQ("Frequency weight variable: name = w, label = \n\tBINRoundEncoder: option = Truncate to smaller int\n"
              "\t\tUser-missing values for this encoder:\n\t\t" +
                  missing + "\n" + missing,
              Shown(weight));
}
