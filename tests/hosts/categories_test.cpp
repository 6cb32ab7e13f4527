#include "hosts/mcbin/input/categories.h"
#include "hosts/mcbin/input/columnplan.h"

#include <mcobnqrt/mccommon.h>

#include <gtest/gtest.h>

namespace
{

using Names = std::vector<std::string>;

Column AColumn(std::set<std::string, std::less<>> fields)
{
    Column column;
    column.categories = std::move(fields);
    return column;
}

} // namespace

TEST(Categories, OfNumbersAreInTheirOrderHoweverTheyAreWritten)
{
    Column column = AColumn({"10", "9", "1", "1.0", "1e1", "-0", "0", "99", "-5"});
    column.missingNumbers = {99};
    column.missingInterval = {-7, -3};

    Categories categories(column, NumberForm());

    EXPECT_TRUE(categories.AreNumbers());
    EXPECT_EQ((Names{"0", "1", "9", "10"}), categories.GetNames());
    EXPECT_EQ(0.0, categories.FindCode("-0"));
    EXPECT_EQ(1.0, categories.FindCode("1.0"));
    EXPECT_EQ(3.0, categories.FindCode("1e1"));
    EXPECT_EQ(MCMV::gMissingValue, categories.FindCode("99"));
    EXPECT_EQ(MCMV::gMissingValue, categories.FindCode("-5"));
    EXPECT_EQ(std::nullopt, categories.FindCode("2"));
}

TEST(Categories, AreTextsIfOneIsNoNumberOrAnIdentifier)
{
    for (const char* const field : {"007", "x", "nan"})
    {
        Categories categories(AColumn({"10", "9", field}), NumberForm());
        EXPECT_FALSE(categories.AreNumbers()) << field;
        EXPECT_EQ(3U, categories.GetNames().size()) << field;
        EXPECT_LT(categories.FindCode("10"), categories.FindCode("9")) << field;
    }
}
