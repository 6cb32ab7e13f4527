#include <mcobnqrt/binnumericinterval.h>
#include <mcobnqrt/binnumericusermissing.h>
#include <mcobnqrt/binstringinterval.h>
#include <mcobnqrt/binstringusermissing.h>

#include <gtest/gtest.h>

#include <cmath>
#include <limits>
#include <sstream>
#include <string>

namespace
{

template<class Object>
std::string Shown(const Object& object)
{
    std::ostringstream os;
    object.Display(os);
    return os.str();
}

} // namespace

TEST(Intervals, HoldTheirEndsAndMayBecomeEmpty)
{
    const double largest = std::numeric_limits<double>::max();
    BINNumericInterval numbers(7.0, true);
    EXPECT_TRUE(numbers.Contains(7.0) && numbers.Contains(-largest) && !numbers.Contains(std::nan("")));
    EXPECT_EQ("BINNumericInterval: ( -infinity, 7 ]\n", Shown(numbers));
    EXPECT_EQ("BINNumericInterval: [ 7, infinity )\n", Shown(BINNumericInterval(7.0, false)));
    EXPECT_FALSE(numbers.SetLeftEnd(9.0));
    EXPECT_TRUE(numbers.IsEmpty() && numbers.SetRightEnd(9.0) && numbers == BINNumericInterval(9.0, 9.0));

    BINStringInterval strings("b", true, "d", false);
    EXPECT_TRUE(strings.Contains("b") && strings.Contains("czz"));
    EXPECT_FALSE(strings.Contains("a") || strings.Contains("d") || strings.Contains("C"));
    EXPECT_EQ("BINStringInterval: [ b, d )\n", Shown(strings));
    EXPECT_FALSE(strings.SetRightEnd("b", false));
    EXPECT_TRUE(strings.IsEmpty() && strings.SetRightEnd("b", true) && !strings.SetLeftEnd("c", true));
}

TEST(NumericUserMissing, ContainsItsValuesAndItsInterval)
{
    BINNumericUserMissing missing;
    EXPECT_FALSE(missing.Contains(0.0));
    missing.AddValue(5.0, "refused");
    missing.SetInterval(BINNumericInterval(10.0, 20.0));

    for (const double inside : {5.0, 10.0, 15.0, 20.0}) EXPECT_TRUE(missing.Contains(inside)) << inside;
    for (const double outside : {0.0, 7.0, 20.5}) EXPECT_FALSE(missing.Contains(outside)) << outside;
    EXPECT_EQ("\nStart of BINNumericUserMissing display\nDiscrete missing values:\n\t0\t5, label = refused\n"
              "Missing interval:\nBINNumericInterval: [ 10, 20 ]\nEnd of BINNumericUserMissing display\n",
              Shown(missing));
}

TEST(UserMissing, EqualityGoesByTypeValuesInOrderAndIntervalButNotByLabels)
{
    BINNumericUserMissing a, b, turned;
    a.AddValue(1.0, "x"), a.AddValue(2.0, "y");
    b.AddValue(1.0, "p"), b.AddValue(2.0, "q");
    turned.AddValue(2.0, "y"), turned.AddValue(1.0, "x");
    EXPECT_TRUE(a.IsEqualTo(&b));
    EXPECT_FALSE(a.IsEqualTo(&turned));

    b.SetInterval(BINNumericInterval(3.0, 4.0));
    EXPECT_FALSE(a.IsEqualTo(&b));

    const BINNumericUserMissing noNumbers;
    const BINStringUserMissing noStrings;
    EXPECT_FALSE(noNumbers.IsEqualTo(&noStrings) || noStrings.IsEqualTo(&noNumbers));
    EXPECT_FALSE(noNumbers.IsEqualTo(nullptr) || noStrings.IsEqualTo(nullptr));
}
