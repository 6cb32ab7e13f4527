#include "tests/hosts/mcbinrun.h"

#include <string>
#include <vector>

// Bins that are counted again, in their own data and in others.

namespace
{

class McbinEvaluate : public Mcbin
{
protected:
    /// Writes young_men.csv as data.csv, and its bins as bins.json.
    void MakeBins(const std::string& options) const
    {
        Shell("cp '" EXAMPLE_DATA "/young_men.csv' data.csv");
        ASSERT_EQ(0, Run("supervised data.csv " + options + " --format json >bins.json").exitCode);
    }
};

} // namespace

TEST_F(McbinEvaluate, TheDataThatBinsWereMadeOfGiveThemAgainToTheLastBit)
{
    for (const char* options :
         {"--target college --exclude weight", "--target college --weight weight --attributes wage,iq",
          "--target region --attributes iq,home_at_14 --categorical home_at_14 --closed left",
          "--pairs '*_education:college,iq:library_card' --missing iq=100:110 --weight weight --rounding closest"})
    {
        MakeBins(options);
        ASSERT_EQ(0, Run("evaluate bins.json data.csv --save again.json --strict >tables").exitCode) << options;

        // Only how many values differ is not counted again, and statuses are those of a run.
        const Outcome differences =
            Shell("for i in bins again; do sed -E '/distinct_values|\"status\"/d' $i.json >$i.txt; done; "
                  "diff bins.txt again.txt");
        EXPECT_EQ("", differences.out) << options;
        EXPECT_EQ(std::string::npos, ReadFile(fData.File("tables")).find("PSI 0.0001")) << options;
    }
}

TEST_F(McbinEvaluate, APopulationThatHasMovedIsToldAndFlagged)
{
    MakeBins("--target college --attributes iq,home_at_14 --categorical home_at_14");
    Write("moved.csv", "iq,home_at_14\n200,both parents\n140,on Mars\n,both parents\n120,\n");

    const Outcome outcome = Run("evaluate bins.json moved.csv --strict --report page.html");
    EXPECT_EQ(3, outcome.exitCode);
    for (const char* words : {"! the population has shifted", "! categories that the bins do not know: 'on Mars'",
                              "weight of values above 149, which the bins were made without: 1"})
    {
        EXPECT_NE(std::string::npos, outcome.out.find(words)) << outcome.out;
    }
    EXPECT_EQ(std::string::npos, outcome.out.find("gain")) << "the data have no target";
    const std::string page = ReadFile(fData.File("page.html"));
    EXPECT_NE(std::string::npos, page.find("on Mars"));
    EXPECT_EQ(std::string::npos, page.find("<script"));
    EXPECT_EQ(0, Run("evaluate bins.json moved.csv").exitCode);

    Write("target.csv", "iq,home_at_14,went\n100,both parents,yes\n90,both parents,perhaps\n");
    EXPECT_NE(std::string::npos, Run("evaluate bins.json target.csv --target went")
                                     .out.find("! records with a category of the target that the bins do not know: "
                                               "weight 1\n"));
}

TEST_F(McbinEvaluate, CutPointsOfAPersonMakeBins)
{
    MakeBins("--target college --attributes iq --weight weight");
    const std::string cut = "evaluate data.csv --cuts iq=90,105.5 --target college --weight weight";
    ASSERT_EQ(0, Run(cut + " --save own.json >own.txt").exitCode);
    ASSERT_EQ(0, Shell("sed -E 's/(\"cut_points\": ).*/\\1[90, 105.5],/' bins.json >edited.json").exitCode);
    ASSERT_EQ(0, Run("evaluate edited.json data.csv --save again.json >again.txt").exitCode);

    const std::string bins = "sed -n '/\"bins\"/,$p'";
    EXPECT_EQ(Shell(bins + " own.json").out, Shell(bins + " again.json").out);
    EXPECT_NE(std::string::npos, ReadFile(fData.File("again.json")).find("\"edited\": true"));
    EXPECT_NE(std::string::npos, ReadFile(fData.File("own.txt")).find("  (90, 105.5]"));
    EXPECT_NE(std::string::npos, ReadFile(fData.File("own.txt")).find(", edited, "));
    EXPECT_EQ("mcbin: edited.json: results[0].bins: there must be one bin more than there are cut points\n",
              Run("apply edited.json data.csv").err);
}

TEST_F(McbinEvaluate, WhatCanNotBeEvaluatedIsToldInWords)
{
    MakeBins("--target college --attributes iq --weight weight");
    struct Case
    {
        const char* arguments;
        int exitCode;
        const char* words;
    };
    const Case cases[] = {
        {"bins.json", 2, "BINS.json and DATA are needed, or --cuts and DATA"},
        {"bins.json data.csv --cuts iq=1", 2, "with --cuts there is only DATA, as these make the bins"},
        {"bins.json data.csv --format sql", 2, "--format: an evaluation has no form in SQL"},
        {"data.csv --cuts iq=2,1", 1, "--cuts: 'iq': cut points must rise, and 1 does not"},
        {"data.csv --cuts iq=2,x", 1, "--cuts: 'iq=2,x' is not of the form COLUMN=18,25,40"},
        {"data.csv --cuts height=2", 1, "'height'"},
        {"bins.json data.csv --target went", 1, "no column is named 'went'"},
        {"bins.json bad.csv", 1, "bad.csv, line 3: column 'iq': 'x' is not a number"},
        {"bins.json heavy.csv", 1, "heavy.csv, line 2: column 'weight': the weight '-1' is negative"},
        {"bins.json bad.csv --bad missing", 0,
         "there is no column 'weight', the weight of the bins, so each row weighs 1"},
    };
    Write("bad.csv", "iq,college\n100,no\nx,yes\n");
    Write("heavy.csv", "iq,weight\n100,-1\n");
    for (const Case& c : cases)
    {
        const Outcome outcome = Run(std::string("evaluate ") + c.arguments);
        EXPECT_EQ(c.exitCode, outcome.exitCode) << c.arguments;
        EXPECT_NE(std::string::npos, outcome.err.find(c.words)) << outcome.err;
    }
}
