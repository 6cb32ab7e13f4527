#include <mcobnqrt/bincatnumencoder.h>
#include <mcobnqrt/binnumericusermissing.h>
#include <mcobnqrt/binroundencoder.h>
#include <mcobnqrt/binstringencoder.h>
#include <mcobnqrt/binstringusermissing.h>
#include <mcobnqrt/mccommon.h>

#include <gtest/gtest.h>

#include <cmath>
#include <memory>
#include <sstream>
#include <string>
#include <vector>

namespace
{

constexpr double kMissing = MCMV::gMissingValue;

template<class UserMissing, class Value>
std::unique_ptr<UserMissing> Missing(Value value)
{
    auto missing = std::make_unique<UserMissing>();
    missing->AddValue(value, "label");
    return missing;
}

std::string Shown(const IBINEncoder& encoder)
{
    std::ostringstream os;
    encoder.Display(os);
    return os.str();
}

} // namespace

TEST(CategoricalEncoders, GiveCodesInTheOrderOfFirstSight)
{
    BINCatNumEncoder numbers(std::vector<double>{30.0, kMissing, 10.0, 30.0});
    EXPECT_EQ(2, numbers.GetNumberOfCategories());
    EXPECT_EQ(-1.0, numbers.EncodeConst(20.0));
    EXPECT_EQ(2.0, numbers.Encode(20.0));
    EXPECT_EQ(0.0, numbers.Encode(30.0));
    EXPECT_EQ(20.0, numbers.Decode(2));
    EXPECT_TRUE(numbers.Decode(3) == kMissing && numbers.Decode(-1) == kMissing);

    BINStringEncoder strings(std::vector<std::string>{"m", "f", "m"});
    EXPECT_EQ(-1.0, strings.EncodeConst(""));
    EXPECT_EQ(2.0, strings.Encode(""));
    EXPECT_EQ(0.0, strings.EncodeConst("m"));
    EXPECT_EQ("f", strings.Decode(1));
    EXPECT_TRUE(strings.Decode(3).empty() && strings.Decode(-1).empty());
}

TEST(CategoricalEncoders, MakeNoCategoryOfWhatIsMissing)
{
    BINCatNumEncoder encoder(std::vector<double>{8.0, 9.0});
    ASSERT_TRUE(encoder.SetUserMissingInfo(Missing<BINNumericUserMissing>(8.0).release()));

    // An unguarded search of the map takes a NaN for one of its categories.
    for (const double missing : {kMissing, std::nan(""), 8.0})
    {
        EXPECT_EQ(-1.0, encoder.Encode(missing)) << missing;
        EXPECT_EQ(-1.0, encoder.EncodeConst(missing)) << missing;
    }
    EXPECT_EQ(2, encoder.GetNumberOfCategories());
    EXPECT_EQ(8.0, encoder.Decode(0));
    ASSERT_TRUE(encoder.SetUserMissingInfo(nullptr));
    EXPECT_EQ(0.0, encoder.Encode(8.0));
}

TEST(Encoders, KeepTheirUserMissingObjectWhenTheyRefuseAnotherOrGetItAgain)
{
    const auto number = Missing<BINNumericUserMissing>(7.0);
    const auto string = Missing<BINStringUserMissing>("x");
    BINCatNumEncoder numbers;
    BINStringEncoder strings;
    BINRoundEncoder weights;
    ASSERT_TRUE(numbers.SetUserMissingInfo(number->Clone()));
    ASSERT_TRUE(strings.SetUserMissingInfo(string->Clone()));
    ASSERT_TRUE(weights.SetUserMissingInfo(number.get()));

    EXPECT_FALSE(numbers.SetUserMissingInfo(string.get()));
    EXPECT_FALSE(strings.SetUserMissingInfo(number.get()));
    EXPECT_FALSE(weights.SetUserMissingInfo(string.get()));
    EXPECT_TRUE(strings.SetUserMissingInfo(strings.GetUserMissingInfo()));

    EXPECT_EQ(-1.0, numbers.Encode(7.0));
    EXPECT_EQ(-1.0, strings.Encode("x"));
    EXPECT_EQ(kMissing, weights.Encode(7.0));
}

TEST(CategoricalEncoders, CopiesOutliveAndIgnoreTheirSource)
{
    // Longer than what a string holds in itself, so that a read of the source's memory shows under AddressSanitizer.
    const std::string longValue(100, 'a');
    auto source = std::make_unique<BINStringEncoder>(std::vector<std::string>{"z", longValue});
    source->SetValueLabels({"Z", "A"});
    ASSERT_TRUE(source->SetUserMissingInfo(Missing<BINStringUserMissing>("x").release()));
    BINStringEncoder copy(*source);
    BINStringEncoder assigned(std::vector<std::string>{"old"});
    assigned = *source;
    source->Encode("new");
    source.reset();

    for (BINStringEncoder* encoder : {&copy, &assigned})
    {
        EXPECT_EQ(longValue, encoder->Decode(1));
        EXPECT_EQ("A", encoder->GetValueLabels()->at(1));
        EXPECT_EQ(-1.0, encoder->Encode("x"));
        EXPECT_EQ(2.0, encoder->Encode("old"));
    }
    BINCatNumEncoder numbers(std::vector<double>{2.0, 1.0});
    BINCatNumEncoder assignedNumbers;
    assignedNumbers = numbers;
    EXPECT_EQ(2.0, assignedNumbers.Encode(3.0));
    EXPECT_EQ(1.0, assignedNumbers.Decode(1));
    EXPECT_EQ(2, numbers.GetNumberOfCategories());
}

TEST(CategoricalEncoders, ALabelOfNoCategoryOnlyFillsUp)
{
    BINCatNumEncoder encoder(std::vector<double>{1.0, 2.0, 3.0});

    encoder.SetValueLabel(3, "x");
    EXPECT_EQ(std::vector<std::string>(3), *encoder.GetValueLabels());
    encoder.SetValueLabel(-1, "x");
    encoder.SetValueLabel(1, "two");
    EXPECT_EQ((std::vector<std::string>{"", "two", ""}), *encoder.GetValueLabels());
}

TEST(RoundEncoder, RoundsHalvesUpAndGivesOnlyWeightsAboveZero)
{
    const BINRoundEncoder truncate(IBINVariable::RoundTruncate);
    const BINRoundEncoder closest;
    const BINRoundEncoder asIs(static_cast<IBINVariable::BINWRoundingOption>(7));
    const struct
    {
        double weight, truncated, rounded, unchanged;
    } cases[] = {
        {2.5, 2.0, 3.0, 2.5},
        {0.9, kMissing, 1.0, 0.9},
        {0.4, kMissing, kMissing, 0.4},
        {-3.0, kMissing, kMissing, kMissing},
        {std::nan(""), kMissing, kMissing, kMissing},
    };

    for (const auto& c : cases)
    {
        EXPECT_EQ(c.truncated, truncate.Encode(c.weight)) << c.weight;
        EXPECT_EQ(c.rounded, closest.Encode(c.weight)) << c.weight;
        EXPECT_EQ(c.unchanged, asIs.Encode(c.weight)) << c.weight;
    }
}

TEST(Encoders, DisplaySevenCategoriesALineOrOneALine)
{
    BINCatNumEncoder numbers(std::vector<double>{8, 1, 2, 3, 4, 5, 6});
    numbers.SetValueLabels({"eight"});
    ASSERT_TRUE(numbers.SetUserMissingInfo(std::make_unique<BINNumericUserMissing>().release()));
    EXPECT_EQ("\tBINCatNumEncoder: Last code = 6\n\t\tNumeric values of categories: 8 1 2 3 4 5 6 \n\n"
              "\t\tValue Labels:\neight \n\t\tUser-missing values for this encoder:\n\t\t"
              "\nStart of BINNumericUserMissing display\nEnd of BINNumericUserMissing display\n\n",
              Shown(numbers));
    EXPECT_EQ("\tBINStringEncoder object:  Last code = 1\n\t\t0\t\tm\n\t\t1\t\tf\n",
              Shown(BINStringEncoder(std::vector<std::string>{"m", "f"})));
}
