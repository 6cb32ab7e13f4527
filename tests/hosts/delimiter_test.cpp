#include "hosts/mcbin/input/delimiter.h"
#include "hosts/mcbin/text.h"

#include <gtest/gtest.h>

TEST(Delimiter, IsWhatMostLinesHaveAsOftenAsTheHeader)
{
    struct Case
    {
        const char* text;
        char delimiter;
    };
    const Case cases[] = {{"a,b\n1,2\n", ','},
                          {"a\tb\n1\t2\n", '\t'},
                          {"a;b\n1,5;2,5\n", ';'},
                          {"a|b|c\n1|2|3\n", '|'},
                          {"a\n1\n", ','},
                          {"", ','},
                          {"a,b;c\n1,2;3\n", ','},         // equal ones: the first as listed
                          {"a,b;c;d\n1,2;3;4\n", ';'},     // the one that the header has more often
                          {"\"a,b\";c\n\"1,2\";3\n", ';'}, // what is quoted doesn't count
                          {"a;b,c\n1;2\n3;4\n5,", ';'}};   // nor does a last line without an end
    for (const Case& c : cases) EXPECT_EQ(c.delimiter, DetectDelimiter(c.text)) << c.text;
}

TEST(Delimiter, HasNames)
{
    for (const auto& [name, delimiter] : {std::pair("comma", ','),
                                          {"tab", '\t'},
                                          {"\\t", '\t'},
                                          {"semicolon", ';'},
                                          {"bar", '|'},
                                          {"pipe", '|'},
                                          {"space", ' '},
                                          {":", ':'}})
        EXPECT_EQ(delimiter, ParseDelimiter(name)) << name;
    for (const char* const name : {"", "ab", "\"", "\n", "\r"}) EXPECT_EQ('\0', ParseDelimiter(name)) << name;
}

TEST(Patterns, StandForNamesAsInAShellUnlessTheyAreEscaped)
{
    EXPECT_TRUE(Matches("x_*", "x_1"));
    EXPECT_TRUE(Matches("x_[12]", "x_2"));
    EXPECT_TRUE(Matches("a[", "a["));
    EXPECT_FALSE(Matches("x_?", "x_12"));
    for (const char* const name : {"x_*", "a[b]?", "back\\slash"})
    {
        EXPECT_TRUE(Matches(EscapePattern(name), name)) << name;
        EXPECT_FALSE(Matches(EscapePattern(name), std::string(name) + "x")) << name;
    }
}

TEST(Html, IsEscapedAlsoWithinAttributes)
{
    EXPECT_EQ("&lt;a href=&quot;x&quot;&gt;&amp;\\x0a", EscapeHtml("<a href=\"x\">&\n"));
}
