#include "data/tuplesort.h"
#include "tests/support/hostdata.h"

#include <gtest/gtest.h>

#include <cmath>
#include <limits>
#include <tuple>

namespace
{

/// A total order: what is sorted completely can stand in one way only.
auto CompleteKey(const BINSortTuple& tuple)
{
    return std::make_tuple(tuple.fValue, !std::signbit(tuple.fValue), tuple.fTargetCode, tuple.fWeight);
}

double RandomValue(Dice& dice, int kind)
{
    const double infinity = std::numeric_limits<double>::infinity();
    switch (kind)
    {
    case 0:
        return dice.Fraction() * 6 - 3;
    case 1:
        return dice.Below(9) - 4; // few values, and ties
    case 2:
        return std::ldexp(dice.Fraction() - 0.5, dice.Below(2000) - 1000);
    default:
        return std::vector<double>{
            -0.0, 0.0, infinity, -infinity, 1.7e308, -1.7e308, 5e-324, -5e-324}[static_cast<std::size_t>(
            dice.Below(8))];
    }
}

} // namespace

TEST(TupleSort, PutsAllKindsOfValuesInOrder)
{
    for (const int count : {0, 1, 2, 16, 17, 1000, 70000, 150000}) // the last two are larger than the scratch memory
    {
        for (int kind = 0; kind < 4; ++kind)
        {
            SCOPED_TRACE(std::to_string(count) + " of kind " + std::to_string(kind));
            Dice dice(static_cast<unsigned int>(count + kind));
            std::vector<BINSortTuple> tuples;
            for (int i = 0; i < count; ++i)
                tuples.push_back({RandomValue(dice, kind), static_cast<std::uint8_t>(dice.Below(3)), dice.Fraction()});
            std::vector<BINSortTuple> expected = tuples;
            std::sort(expected.begin(), expected.end(),
                      [](const BINSortTuple& left, const BINSortTuple& right)
                      { return CompleteKey(left) < CompleteKey(right); });
            std::vector<BINSortTuple> byValueAlone = tuples;
            const BINSortTuple leftOver{-1e300, 7, 7.0};
            tuples.push_back(leftOver);

            SortTuples(tuples, static_cast<unsigned int>(count), TieOrder::kComplete);
            SortTuples(byValueAlone, static_cast<unsigned int>(count), TieOrder::kAny);

            EXPECT_EQ(CompleteKey(leftOver), CompleteKey(tuples.back())) << "behind the tuples that count";
            for (std::size_t i = 0; i < expected.size(); ++i)
            {
                ASSERT_EQ(CompleteKey(expected[i]), CompleteKey(tuples[i])) << "tuple " << i;
                ASSERT_EQ(expected[i].fValue, byValueAlone[i].fValue) << "tuple " << i;
                ASSERT_EQ(std::signbit(expected[i].fValue), std::signbit(byValueAlone[i].fValue)) << "tuple " << i;
            }
        }
    }
}
