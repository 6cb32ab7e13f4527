#include "tests/hosts/mcbinrun.h"

#include <zstd.h>

#include <algorithm>
#include <string>
#include <vector>

// What the tool makes of a file.

namespace
{

constexpr const char* kHeights = "height,\"city, zip\",size,flat,void\n"
                                 "1.5,\"A, \"\"0\"\"\",small,7,\n"
                                 "2, B ,small,7,\n"
                                 "2.5,B,small,7,\n"
                                 "3,B,small,,\n"
                                 "1.1e1,B,\"größer\",7,\n"
                                 "+12,B,größer,7,\n"
                                 "13,B,größer,7,\n"
                                 "14,B,größer,7,\n"
                                 "\n"
                                 ",C,small,7,\n"
                                 "12,C,,7,\n";

constexpr const char* kHeightsBySize = R"(height by size: gain 1.0000 bits, 100.0%
  entropy 1.0000 before, 0.0000 after
  8 distinct values from 1.5 to 14, missing weight 2
  bin        weight   share  größer  small    rate     WoE      IV
  (-inf, 3]       4   44.4%       0      4  100.0%  +1.974  1.5299  ▓▓▓▓▓▓▓▓▓▓▓▓▓▓▓▓▓▓▓▓▓▓▓▓▓▓▓▓▓▓
  (3, +inf)       4   44.4%       4      0    0.0%  -2.420  2.4809  ██████████████████████████████
  missing         1   11.1%       0      1  100.0%  +0.875  0.1532  ▓▓▓▓▓▓▓▓▓▓▓▓▓▓▓▓▓▓▓▓▓▓▓▓▓▓▓▓▓▓
  total           9  100.0%       4      5   55.6%          4.1640
  █ größer ▓ small
  rate and WoE of 'small'; information value 4.1640
  0.5 added where a category has no weight

Without cut points:
  flat by size  warning 120014: all valid values are equal
  void by size  warning 120015: no record has a valid value

Left out: city, zip (3 categories in 10 records, such as 'A, "0"' in line 2)
)";

std::string Replace(std::string text, const std::string& what, const std::string& with)
{
    for (std::size_t at = 0; (at = text.find(what, at)) != std::string::npos; at += with.size())
        text.replace(at, what.size(), with);
    return text;
}

std::string CompressZstd(const std::string& text)
{
    std::string compressed(ZSTD_compressBound(text.size()), '\0');
    compressed.resize(ZSTD_compress(compressed.data(), compressed.size(), text.data(), text.size(), 3));
    return compressed;
}

using McbinInput = Mcbin;

} // namespace

TEST_F(McbinInput, LineEndsDelimitersAndAUtf8MarkMakeNoDifference)
{
    const std::string heights = kHeights;
    const std::string withoutComma = Replace(heights, "city, zip", "city; zip");
    const std::vector<std::string> variants{heights,
                                            Replace(heights, "\n", "\r\n"),
                                            Replace(heights, "\n", "\r"),
                                            heights.substr(0, heights.size() - 1),
                                            "\xEF\xBB\xBF" + heights,
                                            "\xEF\xBB\xBF" + Replace(heights, "height", "\"height\"")};
    for (const std::string& variant : variants)
        EXPECT_EQ(kHeightsBySize, RunOn(variant, "supervised", "--target size").out) << variant;
    for (const char* delimiter : {";", ":"})
    {
        const std::string commas = Replace(Replace(heights, "\"city, zip\"", "\"city@ zip\""), "\"A, ", "\"A@ ");
        const std::string data = Replace(Replace(commas, ",", delimiter), "@", ",");
        const std::string option = *delimiter == ':' ? " --delimiter :" : "";
        EXPECT_EQ(kHeightsBySize, RunOn(data, "supervised", "--target size" + option).out) << data;
    }
}

TEST_F(McbinInput, WhatCannotBeRewoundIsReadTwiceAllTheSame)
{
    Write("data.csv", kHeights);
    for (const char* command :
         {"cat data.csv | mcbin supervised - --target size", "mcbin supervised - --target size <data.csv",
          "mkfifo pipe; cat data.csv >pipe & mcbin supervised pipe --target size"})
        EXPECT_EQ(kHeightsBySize, Shell(command).out) << command;
    // Standard input that stands behind its first line begins there.
    EXPECT_NE(std::string::npos, Shell("{ read -r line; mcbin supervised - --target size; } <data.csv")
                                     .err.find("standard input: no column is named 'size'; there are '1.5', "));
}

TEST_F(McbinInput, OrderOfRowsMakesNoDifference)
{
    const std::string iris = "'" EXAMPLE_DATA "/iris.csv'";
    Shell("{ head -n 1 " + iris + "; tail -n +2 " + iris + " | sort -r; } >sorted.csv");

    const Outcome outcome = Run("supervised " + iris + " --target species --format csv");

    EXPECT_NE(std::string::npos,
              outcome.out.find("petal_length,species,1,\"(1.9, 4.7]\",1.9,4.7,right,45,0.3,,,,0,44,1,0,0.97"));
    EXPECT_EQ(outcome.out, Run("supervised sorted.csv --target species --format csv").out);
}

TEST_F(McbinInput, AFileOfManyBlocksLosesNoRowAndNoLine)
{
    // Quoted and plain rows mixed, so that both ways of reading meet each other at every position of a block.
    std::string data = "x,padding\n";
    for (int i = 1; i <= 60000; ++i)
    {
        data += std::to_string(i) +
                (i % 3 == 0 ? ",plain" : ",\"" + std::string(static_cast<std::size_t>(i % 7), '\n') + "\"") + "\n";
    }
    data += "60001," + std::string(3000000, 'y') + "\n";

    const Outcome whole = RunOn(data, "equal-frequency", "--bins 2 --attributes x");
    const Outcome broken = RunOn(data + "1,2,3\n", "equal-frequency", "--bins 2");

    EXPECT_NE(std::string::npos, whole.out.find("60001 distinct values from 1 to 60001, missing weight 0"));
    const long line = std::count(data.begin(), data.end(), '\n') + 1;
    EXPECT_EQ("mcbin: data.csv, line " + std::to_string(line) + ": wrong number of fields: 3, but the header has 2\n",
              broken.err);
}

TEST_F(McbinInput, TextFarBehindNumbersCountsAsItDoesInFront)
{
    // Behind so many numbers no field is looked at until the run comes to it, in the midst of quoted rows.
    const std::string header = "x,z,note,y\n";
    std::string numbers;
    for (int i = 0; i < 3000; ++i)
        numbers += std::to_string(i % 50) + "," + std::to_string(i) + ",\"a\nb\"," + (i % 50 < 20 ? "low\n" : "up\n");
    const std::string text = "none,1,n,low\n";
    std::string texts;
    for (int i = 0; i < 4000; ++i) texts += text;

    const Outcome failed = RunOn(header + numbers + text + numbers, "supervised", "--target y");
    EXPECT_EQ(1, failed.exitCode);
    EXPECT_EQ(0U, failed.err.find("mcbin: data.csv, line 6002: column 'x': 'none' is not a number")) << failed.err;

    const std::string options = "--target y --bad missing --attributes x";
    const Outcome inFront = RunOn(header + text + numbers, "supervised", options);
    const Outcome behind = RunOn(header + numbers + text, "supervised", options);
    EXPECT_NE(std::string::npos, behind.out.find("50 distinct values from 0 to 49, missing weight 1")) << behind.out;
    EXPECT_EQ(inFront.out, behind.out);

    const Outcome mostlyText = RunOn(header + numbers + texts, "supervised", "--target y");
    EXPECT_EQ(0, mostlyText.exitCode);
    EXPECT_NE(std::string::npos, mostlyText.out.find("x (text among numbers, such as 'none' in line 6002)"))
        << mostlyText.out;
}

TEST_F(McbinInput, BadInputFailsInWordsThatNameThePlace)
{
    struct Case
    {
        const char* data;
        const char* err;
    };
    const Case cases[] = {
        {"", ": the file is empty; its first line should name the columns"},
        {"x,y\n", ": there is no row below the header"},
        {"x,z\n1,2\n", ": no column is named 'y'; there are 'x', 'z'"},
        {"x,y\n\"1\n\",a\n\n2\n", ", line 5: wrong number of fields: 1, but the header has 2"},
        {"x,y\n1,a\n2,\"b\n3,c\n", ", line 3: a quoted field in this row is never closed"},
        {"x,y\n1,a,b\n2,5\" disk\n", ", line 2: wrong number of fields: 3, but the header has 2"},
        {"x,y\n1,a\n2,5\" disk\n", ", line 3: a quote where none can be: a field that holds one must be quoted, and "
                                   "the quote in it doubled"},
        {"x,y\n1,a\n2,m\xFCnster\n",
         ", line 3: column 'y': 'm\\xfcnster' is not UTF-8 text; convert the file first, for "
         "instance with iconv"},
        {"\xFF\xFEx", ": the file is UTF-16; make it UTF-8 first, as by iconv -f UTF-16 -t UTF-8"},
        {"x;y\n1;a\n2,5;b\n3;b\n",
         ", line 3: column 'x': '2,5' is not a number: it has a comma, and numbers are written "
         "as in 1234.5, unless --decimal and --thousands say otherwise; --exclude leaves the column out, and "
         "--categorical bins its fields as categories"},
        {"x,y\n1,a\n2,b\nmany,a\n", ", line 4: column 'x': 'many' is not a number; if it stands for a missing value, "
                                    "say so with --missing-text, and with --bad missing for all such fields; "
                                    "--exclude leaves the column out, and --categorical bins its fields as categories"},
    };
    for (const Case& c : cases)
    {
        const Outcome outcome = RunOn(c.data, "supervised", "--target y");
        EXPECT_EQ(1, outcome.exitCode) << c.data;
        EXPECT_EQ("", outcome.out) << c.data;
        EXPECT_EQ("mcbin: data.csv" + std::string(c.err) + "\n", outcome.err) << c.data;
    }
    EXPECT_EQ("mcbin: none.csv: No such file or directory\n", Run("supervised none.csv --target y").err);
    EXPECT_EQ(1, Run("supervised . --target y").exitCode);
}

TEST_F(McbinInput, AFileWithDecimalCommasHasNoNumbers)
{
    EXPECT_EQ(
        "mcbin: there is nothing to bin: no column could be an attribute; left out: x (text, such as '1,5' in line 2); "
        "numbers are written as in 1234.5, without commas, $ and %\n",
        RunOn("x;y\n1,5;a\n2,5;b\n", "supervised", "--target y").err);
}

TEST_F(McbinInput, NumbersAreReadInTheFormThatIsTold)
{
    const std::string settings = "--target y --weight w --missing x=-9 --categorical g --format json ";
    std::string expected =
        RunOn("x,g,y,w\n1234.5,1.5,a,0.5\n2,2.5,a,1\n-9,2.5,a,1\n1000000.25,1.50,b,2\n7,2.5,b,1000\n", "supervised",
              settings)
            .out;
    struct Case
    {
        const char* data;
        const char* options;
    };
    for (const Case& c : {Case{"x;g;y;w\n1.234,5;1,5;a;0,5\n2;2,5;a;1\n-9,0;2,5;a;1\n1.000.000,25;1,50;b;2\n7,00;2,5;b;"
                               "1.000\n",
                               "--decimal comma --thousands point"},
                          {"x,g,y,w\n\"1 234,5\",\"1,5\",a,\"0,5\"\n2,\"2,5\",a,1\n-9,\"2,5\",a,1\n\"1\xc2\xa0"
                           "000 000,25\",\"1,50\",b,2\n7,\"2,5\",b,1\xe2\x80\xaf"
                           "000\n",
                           "--decimal , --thousands space"},
                          {"x;g;y;w\n1,234.5;1.5;a;.5\n2;2.5;a;1\n-9;2.5;a;1\n1,000,000.25;1.50;b;2\n7;2.5;b;1,000\n",
                           "--thousands ,"}})
    {
        EXPECT_EQ(expected, RunOn(c.data, "supervised", settings + c.options).out) << c.data;
        Write("bins.json", expected);
        const Outcome applied = Run(std::string("apply bins.json data.csv ") + c.options);
        EXPECT_EQ("", applied.err);
        const Outcome evaluated = Run(std::string("evaluate bins.json data.csv --strict ") + c.options);
        EXPECT_EQ(0, evaluated.exitCode) << evaluated.out << evaluated.err;
    }
    EXPECT_EQ("mcbin: --thousands: the decimal sign can't stand between thousands, too\n",
              RunOn("x\n1\n", "equal-frequency", "--thousands point").err);
}

TEST_F(McbinInput, WhatIsNotUtf8DoesNoHarmWhereItIsNotUsed)
{
    const std::string data = "x,y,\xE4,z\n1,a,\xFF,\xFC\n2,a,,\xFC\n3,b,,\xFC\n4,b,,\xFC\n";

    EXPECT_EQ(0, RunOn(data, "supervised", "--target y --attributes x --format json").exitCode);
    EXPECT_EQ("mcbin: the name of column '\\xe4' is not UTF-8 text\n", RunOn(data, "supervised", "--target y").err);
    EXPECT_EQ("mcbin: the text for missing values '\\xff' is not UTF-8 text\n",
              RunOn(data, "supervised", "--target y --attributes x --missing-text '\xFF'").err);
}

TEST_F(McbinInput, ManyDistinctValuesAreBinnedBeforeAndSmallBinsMergedAfterwards)
{
    std::string data = "x,y\n";
    for (int i = 1; i <= 210; ++i) data += std::to_string(i) + (i <= 100 ? ",a\n" : i <= 110 ? ",b\n" : ",c\n");
    const auto cutPoints = [&](const std::string& options)
    {
        RunOn(data, "supervised", "--target y --format csv " + options + " >bins.csv");
        return Shell("sed '1d;s/\"[^\"]*\"//' bins.csv | head -n -2 | cut -d, -f6 | tr '\\n' ' '").out;
    };

    EXPECT_EQ("100 110 ", cutPoints(""));
    EXPECT_EQ("100 110 ", cutPoints("--distinct-threshold 210 --bins 3"));
    // Three bins of 70 have their borders between 70 and 71 and between 140 and 141.
    EXPECT_EQ("70.5 140.5 ", cutPoints("--distinct-threshold 209 --bins 3"));
    // The bin of b has a tenth of the weight of either neighbour.
    EXPECT_EQ("100 110 ", cutPoints("--small-bins 0.09"));
    EXPECT_EQ("110 ", cutPoints("--small-bins 0.11"));
}

TEST_F(McbinInput, ATargetHasFrom2To256Categories)
{
    std::string data = "x,y\n";
    for (int i = 1; i <= 256; ++i) data += std::to_string(i) + "," + std::to_string(i) + "\n";

    EXPECT_EQ(0, RunOn(data, "supervised", "--target y").exitCode);
    EXPECT_EQ("mcbin: data.csv, line 258: column 'y': more than 256 categories, which are too many for a target; how a "
              "column of numbers becomes one is told by 'mcbin supervised --help'\n",
              RunOn(data + "1,257\n", "supervised", "--target y").err);
    EXPECT_EQ("mcbin: column 'y' has a single category, '3'; a target needs at least 2\n",
              RunOn("x,y\n1,3\n2,\n", "supervised", "--target y").err);
}

TEST_F(McbinInput, MissingValuesAreDeclaredByTextByValueByIntervalOrAsWhatIsBad)
{
    struct Case
    {
        const char* options;
        const char* missingAndRange;
    };
    // Eight rows: 1, 2, 3, 9, 90, 99, NA and an empty one.
    const std::string data = "x,z\n1,a\n2,b\n3,a\n9,b\n90,a\n99,b\nNA,a\n,a\n";
    const Case cases[] = {
        {"--missing-text NA", "6 distinct values from 1 to 99, missing weight 2"},
        {"--missing-text n/a,NA", "6 distinct values from 1 to 99, missing weight 2"},
        {"--bad missing", "6 distinct values from 1 to 99, missing weight 2"},
        {"--missing x=NA,9", "5 distinct values from 1 to 99, missing weight 3"},
        {"--missing-text NA --missing 'x=90:99'", "4 distinct values from 1 to 9, missing weight 4"},
        {"--missing-text NA --missing '?=9.0,90:'", "3 distinct values from 1 to 3, missing weight 5"},
        {"--missing-text NA --missing x=:2 --missing x=3", "3 distinct values from 9 to 99, missing weight 5"},
    };
    for (const Case& c : cases)
    {
        EXPECT_NE(std::string::npos, RunOn(data, "equal-frequency", c.options).out.find(c.missingAndRange))
            << c.options << RunOn(data, "equal-frequency", c.options).err;
    }
    EXPECT_NE(std::string::npos, RunOn(data, "equal-frequency", "").err.find("line 8: column 'x': 'NA' is not a"));
    EXPECT_EQ(1, RunOn(data, "equal-frequency", "--bad missing --missing x=9:1").exitCode);
}

TEST_F(McbinInput, ColumnsAreChosenByNameAndPatternAndTheirKindsOverruled)
{
    const std::string data =
        "x_1,x_2,y,grade,flag,\"x_1,y\"\n1,5,no,b,0,1\n2,6,no,c,1,1\n3,7,yes,a,0,2\n4,8,yes,a,1,2\n";
    const auto attributes = [&](const std::string& options)
    { return RunOn(data, "equal-frequency", "--bins 2 --format csv " + options + " | cut -d, -f1 | uniq").out; };

    EXPECT_EQ("attribute\nx_1\nx_2\nflag\n", attributes("--exclude x_1,y"));
    EXPECT_EQ("attribute\n\"x_1\n", attributes("--attributes x_1,y")) << "the column of this name, with its comma";
    EXPECT_EQ("attribute\nx_1\nx_2\n", attributes("--attributes 'x_?'"));
    EXPECT_EQ("attribute\nx_2\n", attributes("--attributes 'x_?' --exclude x_1"));
    EXPECT_EQ("attribute\nx_1\ngrade\n", attributes("--attributes x_1,grade --categorical grade"));
    EXPECT_EQ("attribute\ngrade\n", attributes("--attributes grade"));
    EXPECT_NE(std::string::npos, RunOn(data, "equal-frequency", "--continuous y --attributes y").err.find("line 2"));
    EXPECT_NE(std::string::npos, RunOn(std::string(24, ';') + "last\n", "supervised", "--target y")
                                     .err.find("no column is named 'y'; there are 'column 1', 'column 2', "));
    EXPECT_NE(std::string::npos, Run("supervised data.csv --target y").err.find("'column 20' and 5 more\n"));
}

TEST_F(McbinInput, NamesThatLookLikePatternsOrOptionsStandForTheirColumns)
{
    struct Case
    {
        const char* header;
        const char* options;
        const char* words;
    };
    const Case cases[] = {
        {"*,a,b", "", "attributes: * a b "},
        {"*,a,b", "--attributes '*'",
         "'*' is the name of a column, and a pattern that 'a' matches, too; '[*]' stands for "
         "the column alone"},
        {"*,a,b", "--exclude '[*]'", "attributes: a b "},
        {"*,a,b", "--missing '*=0'", "'[*]' stands for the column alone"},
        {"a[1],a?,b", "--attributes 'a[1],b'", "attributes: a[1] b "},
        {"a[1],a1,b", "--attributes 'a[1]'", "'a[[]1]' stands for the column alone"},
        {"a[1],a1,b", "--attributes 'a[[]1]'", "attributes: a[1] "},
        {"--weight,-x,--", "", "attributes: --weight -x -- "},
        {"--weight,-x,--", "--attributes=-x --weight=--weight", "attributes: -x "},
        {",a,b", "", "attributes: column 1 a b "},
        {"a,b,c", "--weight ''", "mcbin: --weight: the name is empty"},
        {"a,b,c", "--report ''", "mcbin: --report: the name is empty"},
        {"a,b,c", "--temp-dir ''", "mcbin: --temp-dir: the name is empty"},
        {"a,b,c", "--exclude ''", "no column is named ''; there are 'a', 'b', 'c'"},
    };
    for (const Case& c : cases)
    {
        const Outcome outcome =
            RunOn(std::string(c.header) + "\n1,5,3\n2,6,4\n3,7,5\n", "equal-frequency",
                  std::string("--bins 2 --format csv ") + c.options + " | sed 1d | cut -d, -f1 | uniq | tr '\\n' ' '");
        const std::string words = outcome.out.empty() ? outcome.err : "attributes: " + outcome.out;
        EXPECT_NE(std::string::npos, words.find(c.words)) << c.header << ' ' << c.options << '\n' << words;
    }
}

TEST_F(McbinInput, PairsBinForSeveralTargetsInOnePass)
{
    std::string data = "a,b,p,q\n";
    for (int i = 0; i < 40; ++i)
        data += std::to_string(i) + "," + std::to_string(-i) + (i < 20 ? ",no" : ",yes") + (i < 10 ? ",lo\n" : ",hi\n");

    const Outcome outcome = RunOn(data, "supervised", "--pairs '*:p' --pairs b:q,a:p --smoothing 0 --format csv");

    EXPECT_EQ("attribute,target,bin,label,left,right,closed,weight,share,rate,woe,iv,weight:p=no,weight:p=yes,weight:q="
              "hi,weight:q=lo\n"
              "a,p,0,\"(-inf, 19]\",-inf,19,right,20,0.5,0,-inf,inf,20,0,,\n"
              "a,p,1,\"(19, +inf)\",19,inf,right,20,0.5,1,inf,inf,0,20,,\n"
              "a,p,total,total,,,right,40,1,0.5,0,inf,20,20,,\n"
              "b,p,0,\"(-inf, -20]\",-inf,-20,right,20,0.5,1,inf,inf,0,20,,\n"
              "b,p,1,\"(-20, +inf)\",-20,inf,right,20,0.5,0,-inf,inf,20,0,,\n"
              "b,p,total,total,,,right,40,1,0.5,0,inf,20,20,,\n"
              "b,q,0,\"(-inf, -10]\",-inf,-10,right,30,0.75,0,-inf,inf,,,30,0\n"
              "b,q,1,\"(-10, +inf)\",-10,inf,right,10,0.25,1,inf,inf,,,0,10\n"
              "b,q,total,total,,,right,40,1,0.25,0,inf,,,30,10\n",
              outcome.out)
        << outcome.err;
    EXPECT_EQ(1, RunOn(data, "supervised", "--pairs a:none").exitCode);
}

TEST_F(McbinInput, CompressedFilesAreReadAsWhatTheyStandFor)
{
    const std::string heights = kHeights;
    Write("data.csv", heights);
    Shell("gzip -c data.csv >one.gz; head -c 40 data.csv | gzip -c >two.gz; tail -c +41 data.csv | gzip -c >>two.gz; "
          "cp two.gz padded.gz; head -c 512 /dev/zero >>padded.gz");
    Write("one.zst", CompressZstd(heights.substr(0, 40)) + CompressZstd(heights.substr(40)));

    for (const char* command :
         {"mcbin supervised one.gz --target size", "mcbin supervised two.gz --target size",
          "mcbin supervised padded.gz --target size", "cat two.gz | mcbin supervised - --target size",
          "mcbin supervised one.zst --target size", "mcbin supervised - --target size <one.zst"})
        EXPECT_EQ(kHeightsBySize, Shell(command).out) << command;
    Shell("mcbin supervised data.csv --target size --format json >bins.json");
    EXPECT_EQ(Run("apply bins.json data.csv").out, Run("apply bins.json two.gz").out);

    struct Case
    {
        const char* spoil; ///< what makes a file of one.gz or one.zst
        const char* words;
    };
    const Case cases[] = {
        {"head -c 100 one.gz", "file: the compressed data end too early"},
        {"head -c 60 one.zst", "file: the compressed data end too early"},
        {"head -c 30 one.zst; tail -c +34 one.zst", "file: the zstd data are damaged"},
        {"head -c -8 one.gz; printf 12345678", "file: the gzip data are damaged"},
        {"cat two.gz data.csv", "file: the gzip data are damaged"},
        {"printf 'PK\\003\\004....'", "file: this is zip, and no text; read it with: unzip -p FILE | mcbin"},
        {"printf 'PAR1\\025....'", "file: this is Parquet, and no text; read it with: duckdb"},
        {"printf '\\3757zXZ\\000...'", "file: this is xz, and no text; read it with: xz -dc FILE | mcbin"},
        {"echo a,b | bzip2", "file: this is bzip2, and no text; read it with: bzip2 -dc FILE | mcbin"},
    };
    for (const Case& c : cases)
    {
        const Outcome outcome = Shell("{ " + std::string(c.spoil) + "; } >file; mcbin supervised file --target size");
        EXPECT_EQ(1, outcome.exitCode) << c.spoil;
        EXPECT_EQ(0u, outcome.err.find("mcbin: " + std::string(c.words))) << c.spoil << outcome.err;
    }
}

TEST_F(McbinInput, TablesWithoutAHeaderWithCommentsAndWithNamesTwice)
{
    const std::string named = RunOn("column 1,column 2\n1,a\n2,a\n3,b\n4,b\n", "supervised", "--target 'column 2'").out;
    EXPECT_EQ(named, RunOn("1,a\n2,a\n3,b\n4,b\n", "supervised", "--target 'column 2' --no-header").out);
    Write("data.csv", "1,a\n2,a\n3,b\n4,b\n");
    EXPECT_EQ(named, Shell("cat data.csv | mcbin supervised - --target 'column 2' --no-header").out);
    Shell("mcbin supervised data.csv --target 'column 2' --no-header --format json >bins.json");
    EXPECT_EQ("1,a,0\n2,a,0\n3,b,1\n4,b,1\n", Run("apply bins.json data.csv --no-header").out);
    Write("data.csv", "\xEF\xBB\xBF"
                      "1,a\n");
    EXPECT_EQ("\xEF\xBB\xBF"
              "1,a,0\n",
              Run("apply bins.json data.csv --no-header").out);
    EXPECT_EQ("mcbin: data.csv: --comment: ',' separates the fields\n",
              RunOn("x,y\n1,a\n2,b\n", "supervised", "--target y --comment ,").err);

    for (const char* text : {"# made; by; hand\nx,y\n1,a\n#\n2,\"a\"\n3,b\n# end\n4,b",
                             "# of\r\nx,y\r\n1,a\r\n2,a\r\n#\r\n3,b\r\n4,b\r\n"})
    {
        const std::string commented = RunOn(text, "supervised", "--target y --comment '#'").out;
        EXPECT_EQ(RunOn("x,y\n1,a\n2,a\n3,b\n4,b\n", "supervised", "--target y").out, commented) << text;
    }
    EXPECT_NE(std::string::npos,
              RunOn("x,y\n#,a\n2,\"\n#\"\n", "supervised", "--target y --comment '#'").err.find("single"));

    const Outcome twice = RunOn("x,y,x,x_2,x\n1,a,2,3,4\n2,b,4,5,6\n", "supervised", "--target y --format csv");
    for (const char* name : {"\nx,", "\nx_2,", "\nx_3,", "\nx_4,"})
        EXPECT_NE(std::string::npos, twice.out.find(name)) << twice.out;
    EXPECT_NE(std::string::npos, twice.err.find("another column is named 'x', so column 3 is called 'x_3'"));
    EXPECT_NE(std::string::npos, twice.err.find("another column is named 'x', so column 5 is called 'x_4'"));
    EXPECT_EQ(std::string::npos, twice.err.find("'x_2'")) << "the file names column 4 so: " << twice.err;
}
