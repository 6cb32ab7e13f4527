#include "bins/numberform.h"
#include "bins/numbers.h"
#include "bins/text.h"
#include "bins/utf8.h"

#include <gtest/gtest.h>

#include <clocale>
#include <cmath>
#include <limits>
#include <stdexcept>

namespace
{

constexpr double kInfinity = std::numeric_limits<double>::infinity();
constexpr double kLargest = std::numeric_limits<double>::max();
constexpr double kDenormal = std::numeric_limits<double>::denorm_min();

} // namespace

TEST(Numbers, AreReadWithADecimalPointAndNothingElse)
{
    struct Case
    {
        const char* text;
        double value;
    };
    const Case cases[] = {{"1", 1},
                          {"+5", 5},
                          {"-.5", -0.5},
                          {"5.", 5},
                          {"2.5e-3", 0.0025},
                          {" 7 ", 7},
                          {"0.1", 0.1},
                          {"9007199254740993", 9007199254740992},
                          {"12345678901234567890123456789012345678901", 12345678901234567890123456789012345678901.0},
                          {"1.7976931348623157e308", kLargest},
                          {"5e-324", kDenormal},
                          {"1e-400", 0},
                          {"0.00000000000000000000000000000000000000000000000000e-400", 0},
                          {"inf", kInfinity},
                          {"+Inf", kInfinity},
                          {" -INFINITY ", -kInfinity}};
    for (const Case& c : cases) EXPECT_EQ(c.value, ParseNumber(c.text)) << c.text;
    EXPECT_TRUE(std::signbit(*ParseNumber("-0")));
    for (const char* const text : {"", " ", "1e400", "-1e400", "nan", "NaN", "inf5", "0x10", "+-5", "--5", "1 2", "5x",
                                   "1,5", ".", "-", "+", "e5", "1e", "\t1"})
    {
        EXPECT_EQ(std::nullopt, ParseNumber(text)) << text;
        EXPECT_TRUE(std::isnan(ParseNumberOrNaN(text))) << text;
    }
}

TEST(Numbers, AreReadInTheFormOfAnotherCountry)
{
    const NumberForm german(',', '.');
    const NumberForm french(',', ' ');
    struct Case
    {
        NumberForm form;
        const char* text;
        double value;
    };
    const Case cases[] = {{german, "1,5", 1.5},
                          {german, " -1.234.567,25 ", -1234567.25},
                          {german, "1234567,25", 1234567.25},
                          {german, "1.234", 1234},
                          {german, ",5", 0.5},
                          {german, "5,", 5},
                          {german, "2,5e-3", 0.0025},
                          {german, "-inf", -kInfinity},
                          {french, "1 234,5", 1234.5},
                          {french,
                           "12\xc2\xa0"
                           "345\xe2\x80\xaf"
                           "678,5",
                           12345678.5},
                          {NumberForm('.', '\''), "1'234.5", 1234.5},
                          {NumberForm('.', ','), "1,234.5", 1234.5}};
    for (const Case& c : cases) EXPECT_EQ(c.value, c.form.Parse(c.text)) << c.text;
    for (const char* const text : {"", " ", "1.5", "1.50", "1.2345", "12.34.567", ".234", "1.234.", "1.234,567.8",
                                   "1234.567", "1,2,3", "1,5.0", "x", ",", "nan"})
    {
        EXPECT_TRUE(std::isnan(german.Parse(text))) << text;
    }
    EXPECT_TRUE(std::isnan(NumberForm(',', '\0').Parse("1.5")));
    EXPECT_THROW(NumberForm(',', ','), std::invalid_argument);
    EXPECT_THROW(NumberForm(';', '\0'), std::invalid_argument);
    EXPECT_THROW(NumberForm('.', '5'), std::invalid_argument);
}

TEST(Numbers, AreWrittenInAsFewDigitsAsReadBack)
{
    struct Case
    {
        double value;
        const char* text;
        const char* weight; ///< as a sum of weights for a person
    };
    const Case cases[] = {{0, "0", "0"},
                          {-0.0, "-0", "-0"},
                          {1e5, "100000", "100000"},
                          {0.1 + 0.2, "0.30000000000000004", "0.3"},
                          {123456789.5, "123456789.5", "123456790"},
                          {1234.5678, "1234.5678", "1234.57"},
                          {999999999999999, "999999999999999", "999999999999999"},
                          {1e15, "1e+15", "1e+15"},
                          {1e-5, "0.00001", "1e-05"},
                          {9.5e-6, "9.5e-06", "9.5e-06"},
                          {kLargest, "1.7976931348623157e+308", "1.7976931348623157e+308"},
                          {kDenormal, "5e-324", "4.94066e-324"},
                          {kInfinity, "inf", "inf"},
                          {-kInfinity, "-inf", "-inf"}};
    for (const Case& c : cases)
    {
        EXPECT_EQ(c.text, FormatNumber(c.value));
        EXPECT_EQ(c.weight, FormatWeight(c.value));
        EXPECT_EQ(c.value, ParseNumber(c.text));
    }
    EXPECT_EQ("none", FormatFigure(std::nullopt));
    EXPECT_EQ("0", FormatCategoryNumber(-0.0));
}

TEST(Numbers, SignsAroundThemAreTold)
{
    EXPECT_EQ("$,", FindOrnaments("$1,234.50"));
    EXPECT_EQ("%", FindOrnaments("12%"));
    EXPECT_EQ("", FindOrnaments("1234"));
    EXPECT_EQ("", FindOrnaments("$ and more"));
}

TEST(Utf8, CodePointsAreThoseOfTheStandardAndNoOthers)
{
    struct Case
    {
        const char* text;
        char32_t value;
        std::size_t size;
        bool isValid;
    };
    const Case cases[] = {{"a", U'a', 1, true},
                          {"\x7F", 0x7F, 1, true},
                          {"\xC3\xA9", 0xE9, 2, true},
                          {"\xE2\x82\xAC!", 0x20AC, 3, true},
                          {"\xF0\x9F\x98\x80", 0x1F600, 4, true},
                          {"\xF4\x8F\xBF\xBF", 0x10FFFF, 4, true},
                          {"\x80", 0x80, 1, false},             // begins nothing
                          {"\xC3", 0xC3, 1, false},             // cut off
                          {"\xC3(", 0xC3, 1, false},            // not continued
                          {"\xC0\xAF", 0xC0, 1, false},         // too long a form
                          {"\xE0\x82\xAC", 0xE0, 1, false},     // too long a form
                          {"\xED\xA0\x80", 0xED, 1, false},     // half of a pair of UTF-16
                          {"\xF4\x90\x80\x80", 0xF4, 1, false}, // beyond the last
                          {"\xF8\x88\x80\x80", 0xF8, 1, false},
                          {"\xFF", 0xFF, 1, false}};
    for (const Case& c : cases)
    {
        const CodePoint point = GetFirst(c.text);
        EXPECT_EQ(c.value, point.value) << c.text;
        EXPECT_EQ(c.size, point.size) << c.text;
        EXPECT_EQ(c.isValid, point.isValid) << c.text;
        EXPECT_EQ(c.isValid, IsText(std::string_view(c.text, c.size))) << c.text;
    }
    EXPECT_FALSE(IsText(std::string_view("a\0b", 3)));
}

TEST(Utf8, WidthIsThatOfATerminal)
{
    const std::string former = std::setlocale(LC_CTYPE, nullptr);
    ASSERT_NE(nullptr, std::setlocale(LC_CTYPE, "C.UTF-8"));
    EXPECT_EQ(5U, GetWidth("h\xC3\xA9llo"));
    EXPECT_EQ(4U, GetWidth("東京"));
    EXPECT_EQ(1U, GetWidth("e\xCC\x81"));
    EXPECT_EQ(1U, GetWidth("\xFF"));
    EXPECT_EQ("東", Clip("東京", 3));
    EXPECT_EQ("e\xCC\x81", Clip("e\xCC\x81t", 1));
    EXPECT_EQ("東...", Shorten("東京都", 3));
    EXPECT_EQ("東京都", Shorten("東京都", 6));
    std::setlocale(LC_CTYPE, former.c_str());
}

TEST(Text, IsMadeFitForATerminalLine)
{
    struct Case
    {
        const char* text;
        const char* printable;
    };
    const Case cases[] = {{"a\nb", "a\\x0ab"},           {"\x1B[A", "\\x1b[A"},
                          {"\xC2\x9B", "\\u009b"},       {"\xE2\x80\xA8", "\\u2028"},
                          {"m\xFCnster", "m\\xfcnster"}, {"m\xC3\xBCnster", "m\xC3\xBCnster"}};
    for (const Case& c : cases) EXPECT_EQ(c.printable, Printable(c.text));
    // What sets the direction of writing; in one literal it would be taken for an attack on the reader.
    for (const auto& [last, escape] : {std::pair("\xAE", "\\u202e"), std::pair("\x8F", "\\u200f")})
        EXPECT_EQ(escape, Printable(std::string("\xE2\x80") + last));
    EXPECT_EQ("'a\\x0a'", Quote("a\n"));
    EXPECT_EQ("'it''s'", Enclose("it's", '\''));
    EXPECT_EQ("a, b", Join({"a", "b"}, ", "));
}
