#include "tests/hosts/mcbinrun.h"
#include "tests/hosts/mcbinterminal.h"

#include <string>

// What the tool shows, in each of its forms.

namespace
{

/// 60 visitors of five kinds; the kind goes with the age.
std::string MakeVisitors()
{
    std::string data = "age,noise,kind\n";
    const char* const kinds[] = {"child", "pupil", "student", "adult", "retired & <old>"};
    for (int i = 0; i < 60; ++i)
        data += std::to_string(i) + "," + std::to_string(i * 7 % 10) + "," + kinds[i % 11 == 0 ? 3 : i / 12] + "\n";
    return data;
}

/// What stands in each cell that holds a number alone, line by line.
std::string CollectNumbers(const std::string& page)
{
    std::string found;
    const std::string begin = "<td>";
    for (std::size_t at = 0; (at = page.find(begin, at)) != std::string::npos;)
    {
        at += begin.size();
        const std::string cell = page.substr(at, page.find('<', at) - at);
        if (cell.find_first_not_of("0123456789.") == std::string::npos)
            found += cell + "\n";
    }
    return found;
}

using McbinOutput = Mcbin;
using McbinOutputOnTerminal = McbinOnTerminal;

} // namespace

TEST_F(McbinOutput, EqualFrequencyTablesComeInTheOrderOfTheData)
{
    const Outcome outcome = RunOn("x,b\n1,5\n2,1\n3,1\n0.1,1\n,1\n", "equal-frequency", "--bins 2 --closed left");

    EXPECT_EQ(R"(x
  4 distinct values from 0.1 to 3, missing weight 1
  bin          weight   share
  (-inf, 1.5)       2   40.0%  ██████████████████████████████
  [1.5, +inf)       2   40.0%  ██████████████████████████████
  missing           1   20.0%  ███████████████
  total             5  100.0%

Without cut points:
  b  warning 120019: no cut point was found: too few different values for the number of bins

)",
              outcome.out);
}

TEST_F(McbinOutput, BinsOfACategoricalAttributeAreSetsOfItsCategories)
{
    const Outcome outcome = RunOn("g\nlow\nlow\nmid\nmid\nhigh\n\"a, b\"\n", "equal-frequency",
                                  "--bins 2 --attributes g --categorical g --report page.html");

    EXPECT_EQ(R"(g
  4 categories from 'a, b' to 'mid', missing weight 0
  bin                weight   share
  {a, b, high, low}       4   66.7%  ██████████████████████████████
  {mid}                   2   33.3%  ███████████████
  total                   6  100.0%

)",
              outcome.out);
    EXPECT_NE(std::string::npos, ReadFile(fData.File("page.html")).find("4 categories from 'a, b' to 'mid'"));
}

TEST_F(McbinOutput, MoreCategoriesThanShadesShareTheLastOne)
{
    const Outcome outcome = RunOn(MakeVisitors(), "supervised", "--target kind --attributes age");

    EXPECT_NE(std::string::npos, outcome.out.find("  █ adult ▓ pupil ▒ retired & <old> ░ others\n")) << outcome.out;
    EXPECT_NE(std::string::npos,
              outcome.out.find("  bin         weight   share   adult   child   pupil  retired & <old>  student\n"))
        << outcome.out;
    EXPECT_NE(std::string::npos,
              outcome.out.find("  IV                          3.9479  4.3777  5.2589           5.2589   5.2589\n"))
        << outcome.out;
}

TEST_F(McbinOutput, JsonHasEveryFigureInItsShortestForm)
{
    const Outcome outcome = RunOn("x,y,w\n0.1,a,1\n0.30000000000000004,a,1\n1e300,b,1\n,b,2\n", "supervised",
                                  "--target y --weight w --missing x=7,90:,unknown --missing-text NA,-9 --format json");

    std::string json = outcome.out;
    const std::size_t version = json.find("(MCOBNQRT ");
    ASSERT_NE(std::string::npos, version);
    json.replace(version, json.find(')', version) - version, "(V");
    EXPECT_EQ(R"json({
  "schema": "mcobnqrt-bins",
  "schema_version": 3,
  "component_version": "Supervised Binning Component Ver. 1.0 (V)",
  "method": "supervised",
  "settings": {"closed": "right", "n_bins": 1000, "max_distinct": null, "small_bin_ratio": 0, "smoothing": 0.5},
  "data": {"name": "data.csv", "records": 4, "records_without_weight": 0, "missing_text": ["NA", "-9"]},
  "reduction": null,
  "variables": [
    {
      "name": "x",
      "label": "",
      "kind": "continuous",
      "role": "attribute",
      "categories": null,
      "category_order": null,
      "order_target": null,
      "rare": null,
      "rounding": null,
      "grid": null,
      "missing": {"values": [7, -9], "texts": ["unknown"], "interval": [90, "inf"]},
      "value_kind": null,
      "time_zone": ""
    },
    {
      "name": "y",
      "label": "",
      "kind": "string-categorical",
      "role": "target",
      "categories": ["a", "b"],
      "category_order": "text",
      "order_target": null,
      "rare": null,
      "rounding": null,
      "grid": null,
      "missing": {"values": [], "texts": [], "interval": null},
      "value_kind": null,
      "time_zone": ""
    },
    {
      "name": "w",
      "label": "",
      "kind": "weight",
      "role": "weight",
      "categories": null,
      "category_order": null,
      "order_target": null,
      "rare": null,
      "rounding": "none",
      "grid": null,
      "missing": {"values": [-9], "texts": [], "interval": null},
      "value_kind": null,
      "time_zone": ""
    }
  ],
  "status": {"code": 120018, "severity": "warning", "words": "some results carry a warning or an error", "discrete": [0, 0, 0], "scale": [0, 0, 0]},
  "results": [
    {
      "attribute": "x",
      "target": "y",
      "status": {"code": 120017, "severity": "warning", "words": "no cut point separates the categories of the target well enough", "discrete": [0, 0, 0], "scale": [0, 0, 0]},
      "edited": false,
      "distinct_values": 2,
      "weight": 2,
      "weight_with_missing": 5,
      "minimum": 0.1,
      "maximum": 0.30000000000000004,
      "target_entropy": 0,
      "model_entropy": 0,
      "information_value": 3.594886226455673,
      "cut_points": [],
      "bins": [
        {"left": "-inf", "right": "inf", "weight": 2, "weights": [2, 0], "rate": 0, "woe": -2.0149030205422647, "iv": 2.182811605587453}
      ],
      "missing": {"weight": 3, "weights": [0, 3], "rate": 1, "woe": 1.540445040947149, "iv": 1.41207462086822},
      "categories": null
    }
  ]
}
)json",
              json);
}

TEST_F(McbinOutput, ThePageHasTheFiguresOfTheTables)
{
    const Outcome csv = RunOn(MakeVisitors(), "supervised", "--target kind --format csv --report page.html");
    const std::string page = ReadFile(fData.File("page.html"));

    // Of each bin its weight and those of its categories: column 8 and, after the share, 10 to 14.
    const std::size_t begin = page.find("<table class=\"bins\">");
    const std::string bins = page.substr(begin, page.find("</table>", begin) - begin);
    const std::string cells = CollectNumbers(bins);
    const Outcome expected =
        Shell("mcbin supervised data.csv --target kind --format csv | grep '^age' | sed 's/\"[^\"]*\"//' | "
              "cut -d, -f8,13-17 | tr , '\\n'");
    EXPECT_EQ(expected.out, cells);
    EXPECT_NE(std::string::npos, page.find("retired &amp; &lt;old&gt;"));
    EXPECT_EQ(std::string::npos, page.find("<script"));
    EXPECT_EQ(std::string::npos, page.find("http"));
    EXPECT_EQ(std::string::npos, page.find("<old>"));
}

TEST_F(McbinOutput, BinsAreShownAgainAsTheRunThatFoundThemShowedThem)
{
    const std::string options = "--target y --missing x=7 --smoothing 1 ";
    const std::string data = "x,c,y\n1,5,a\n2,5,a\n3,5,a\n4,5,b\n5,5,b\n6,5,b\n7,5,a\n8,5,b\n";
    Write("bins.json", RunOn(data, "supervised", options + "--format json").out);
    for (const char* const form : {"table", "html", "json", "csv", "sql", "sql --dialect duckdb --labels"})
    {
        const Outcome run = RunOn(data, "supervised", options + "--format " + form);
        const Outcome shown = Run("show bins.json --format " + std::string(form));
        EXPECT_FALSE(run.out.empty()) << form;
        EXPECT_EQ(run.out, shown.out) << form;
        EXPECT_EQ(run.err, shown.err) << form;
    }
    EXPECT_EQ(3, Run("show bins.json --strict --report page.html").exitCode) << "of one value, and so with a warning";
    EXPECT_EQ(Run("show bins.json --format html").out, ReadFile(fData.File("page.html")));
    EXPECT_NE(std::string::npos, Run("show bins.json --format sql --labels").out.find("THEN '(-inf, 3]'"));
    EXPECT_EQ("mcbin: data.csv: line 1: this is not JSON\n", Run("show data.csv").err);
    EXPECT_EQ(2, Run("show").exitCode);
}

TEST_F(McbinOutput, HelpAndManualPageHaveTheSameTexts)
{
    const Outcome help = Run("supervised --help");
    const Outcome page = Run("--man");

    EXPECT_EQ(0, help.exitCode);
    for (const char* text : {"Cut the columns of numbers where they separate", "mcbin supervised iris.csv"})
    {
        EXPECT_NE(std::string::npos, help.out.find(text)) << text;
        EXPECT_NE(std::string::npos, page.out.find(text)) << text;
    }
    EXPECT_NE(std::string::npos, page.out.find(".TP\n.B \\-\\-target \\fINAME\\fR\n"));
    EXPECT_EQ(0u, Run("--version").out.find("mcbin "));
}

TEST_F(McbinOutputOnTerminal, OnATerminalTablesAreColouredUnlessThatIsUnwanted)
{
    const std::string run = "supervised '" EXAMPLE_DATA "/iris.csv' --target species";

    Terminal coloured(fData.Path(), fTemporary.Path(), run);
    EXPECT_EQ(0, coloured.GetExitCode());
    EXPECT_NE(std::string::npos, coloured.GetText().find("\x1b[1mpetal_width by species\x1b[0m: gain 1.3784 bits"));
    EXPECT_NE(std::string::npos, coloured.GetText().find("\x1b[34m█"));
    EXPECT_NE(std::string::npos, coloured.GetText().find("\r\x1b[Kbinned 4 of 4: petal_width\r\x1b[K"));
    for (const char* setting : {"NO_COLOR=1", "TERM=dumb"})
    {
        Terminal plain(fData.Path(), fTemporary.Path(), run + " --quiet", setting);
        EXPECT_EQ(0, plain.GetExitCode());
        EXPECT_EQ(std::string::npos, plain.GetText().find('\x1b')) << setting;
    }
}

TEST_F(McbinOutputOnTerminal, TablesFitTheTerminalAndStandStraightWithWideCharacters)
{
    const char* const places[] = {"東京", "大阪", "emoji😀", "e\u0301te\u0301", "a very long name of a category"};
    std::string data = "値,place,ja\n";
    for (int i = 0; i < 60; ++i)
        data += std::to_string(1000 * i) + "," + places[i / 12] + "," + (i < 24 ? "nein" : "ja") + "\n";
    Write("data.csv", data + "61000,大阪,nein\n");
    const auto print = [&](const std::string& options, unsigned short width)
    {
        Terminal terminal(fData.Path(), fTemporary.Path(), "supervised data.csv --quiet " + options, "NO_COLOR=1",
                          width);
        EXPECT_EQ(0, terminal.GetExitCode());
        std::string text;
        for (const char c : terminal.GetText())
        {
            if (c != '\r')
                text += c;
        }
        const std::size_t begin = text.find("  bin ");
        return text.substr(begin, text.find("\n\n", begin) + 1 - begin);
    };

    // Of many categories the heaviest keep their columns, of two the rate tells more than both.
    EXPECT_EQ(R"(  bin             weight   share    大阪  others
  (-inf, 11000]       12   19.7%       0      12  ░░░░░░░░░░
  (11000, 23000]      12   19.7%      12       0  ▒▒▒▒▒▒▒▒▒▒
  (23000, 35000]      12   19.7%       0      12  ▓▓▓▓▓▓▓▓▓▓
  (35000, 47000]      12   19.7%       0      12  ░░░░░░░░░░
  (47000, +inf)       13   21.3%       1      12  █████████▒
  total               61  100.0%      13      48
  IV                              5.7815       -
  █ a very long name of a category ▓ emoji😀 ▒ 大阪 ░ others
  0.5 added where a category has no weight
)",
              print("--target place", 60));
    EXPECT_EQ(R"(  bin                        weight   share    rate
  {a very long ..., 2 more}      36   59.0%    0.0%
  {大阪, 東京}                   25   41.0%  100.0%
  total                          61  100.0%   41.0%
  rate and WoE of 'nein'; information value 8.2246
)",
              print("--target ja --attributes place --categorical place", 51));
    EXPECT_EQ(R"(  bin                      weight   share
  {a very lon..., 2 more}      36   59.0%
  {大阪, 東京}                 25   41.0%
  total                        61  100.0%
)",
              print("--target ja --attributes place --categorical place", 40));
}
