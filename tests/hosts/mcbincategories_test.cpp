// Columns of categories without an order of their own: which of them are binned, and in which order they are cut.

#include "tests/hosts/mcbinrun.h"

namespace
{

/// 60 rows: of each city 12, of which so many have bought, with weights that turn the order of Bonn and Essen round.
std::string MakeCities()
{
    struct City
    {
        const char* name;
        int numBought;
        const char* weightIfBought;
    };
    const City cities[] = {
        {"Aachen", 11, "1"}, {"Bonn", 1, "90.3"}, {"Cologne", 2, "1"}, {"Dresden", 10, "1"}, {"Essen", 6, "0.1"}};
    std::string data = "city,bought,again,w\n";
    for (int i = 0; i < 12; ++i)
    {
        for (const City& city : cities)
        {
            const bool isBought = i < city.numBought;
            data += std::string(city.name) + (isBought ? ",yes," : ",no,") + (isBought ? "a," : "b,") +
                    (isBought ? city.weightIfBought : "1") + "\n";
        }
    }
    return data;
}

using McbinCategories = Mcbin;

} // namespace

TEST_F(McbinCategories, AreCutInTheOrderThatTheOptionsName)
{
    struct Case
    {
        const char* options;
        const char* categories; ///< in JSON, by code
        const char* order;
    };
    const Case cases[] = {
        {"--target bought", R"(["Bonn", "Cologne", "Essen", "Dresden", "Aachen"])", R"("rate")"},
        {"--target bought --weight w", R"(["Essen", "Cologne", "Dresden", "Bonn", "Aachen"])", R"("rate")"},
        {"--target bought --category-order text", R"(["Aachen", "Bonn", "Cologne", "Dresden", "Essen"])", R"("text")"},
        {"--target bought --category-order city=Essen,Bonn,Aachen,Cologne,Dresden,Ulm",
         R"(["Essen", "Bonn", "Aachen", "Cologne", "Dresden", "Ulm"])", R"("declared")"},
        // 'yes' comes after 'no', but 'a', which they have in common, before 'b'; the first pair counts.
        {"--pairs city:again,city:bought", R"(["Aachen", "Dresden", "Essen", "Cologne", "Bonn"])", R"("rate")"},
        {"--pairs city:bought,city:again", R"(["Bonn", "Cologne", "Essen", "Dresden", "Aachen"])", R"("rate")"},
        // The column is a target, too, whose categories keep their order.
        {"--pairs city:bought,bought:city", R"(["Aachen", "Bonn", "Cologne", "Dresden", "Essen"])", R"("text")"},
    };
    for (const Case& one : cases)
    {
        const Outcome outcome = RunOn(MakeCities(), "supervised", one.options + std::string(" --format json"));
        const std::string categories =
            "\"categories\": " + std::string(one.categories) + ",\n      \"category_order\": " + one.order;
        EXPECT_NE(std::string::npos, outcome.out.find(categories)) << one.options << outcome.err << outcome.out;
    }
}

TEST_F(McbinCategories, OrderDoesNotDependOnThatOfTheRows)
{
    const std::string options = "supervised - --target bought --weight w --exclude again --format csv";
    Write("cities.csv", MakeCities());

    const Outcome forwards = Shell("cat cities.csv | mcbin " + options);
    const Outcome backwards = Shell("{ head -1 cities.csv; tail -n +2 cities.csv | tac; } | mcbin " + options);

    EXPECT_NE(std::string::npos, forwards.out.find("{Essen")) << forwards.err;
    EXPECT_EQ(forwards.out, backwards.out);
}

TEST_F(McbinCategories, OrderThatCannotBeUsedIsRefused)
{
    struct Case
    {
        const char* arguments;
        int exitCode;
        const char* words;
    };
    const Case cases[] = {
        {"supervised data.csv --target bought --category-order city=Bonn,Essen", 1,
         "the order of the categories of column 'city' lacks 'Aachen'"},
        {"supervised data.csv --target bought --category-order city=Bonn,Bonn", 1, "names one of them twice"},
        {"supervised data.csv --target bought --category-order town=Bonn", 1, "no column is named 'town'"},
        {"supervised data.csv --target bought --category-order rates", 1, "is rate, text or COLUMN=a,b,c"},
        {"equal-frequency data.csv --category-order rate", 2, "rate needs a target"},
    };
    Write("data.csv", MakeCities());
    for (const Case& one : cases)
    {
        const Outcome outcome = Run(one.arguments);
        EXPECT_EQ(one.exitCode, outcome.exitCode) << one.arguments;
        EXPECT_NE(std::string::npos, outcome.err.find(one.words)) << one.arguments << outcome.err;
    }
}

TEST_F(McbinCategories, ColumnsWithoutUsableCategoriesAreLeftOutWithTheReason)
{
    std::string data = "n,kind,id,many,one,bytes,mostly,y\n";
    for (int i = 0; i < 2000; ++i)
    {
        const std::string number = std::to_string(i);
        data += number + ",k" + std::to_string(i % 3) + ",i" + number + ",m" + std::to_string(i % 250 * 2 + i / 1999) +
                ",same," +
                (i == 7       ? "m\xFCnster"
                 : i % 2 == 0 ? "x"
                              : "y") +
                "," + (i % 2 == 0 ? "none" : std::to_string(i % 20)) + (i % 3 == 0 ? ",a\n" : ",b\n");
    }
    const Outcome outcome = RunOn(data, "supervised", "--target y");

    EXPECT_NE(std::string::npos, outcome.out.find("kind by y: gain")) << outcome.out << outcome.err;
    EXPECT_NE(std::string::npos, outcome.out.find("\nLeft out: id (more than 256 categories, such as 'i0' in line 2), "
                                                  "one (a single category, such as 'same' in line 2), "
                                                  "bytes (text that is not UTF-8, such as 'x' in line 2), "
                                                  "mostly (text among numbers, such as 'none' in line 2)\n"))
        << outcome.out;
    EXPECT_NE(std::string::npos, outcome.out.find("many by y")) << "250 categories in 2000 rows are enough";

    const Outcome equalFrequency = RunOn(data, "equal-frequency", "");
    EXPECT_NE(std::string::npos, equalFrequency.out.find("Left out: kind (text, such as 'k0' in line 2), "));
    EXPECT_EQ("mcbin: data.csv, line 2: column 'id': more than 256 categories, which are too many for a categorical "
              "attribute; --exclude leaves the column out\n",
              Run("supervised data.csv --target y --attributes id").err);
    // Five rows for a category are enough, four are not.
    const std::string few = "c,y\np,0\np,1\nq,0\nq,1\np,0\np,1\nq,0\nq,1\np,0\n";
    EXPECT_NE(std::string::npos,
              RunOn(few, "supervised", "--target y").err.find("c (2 categories in 9 records, such as"));
    EXPECT_NE(std::string::npos, RunOn(few + "p,1\n", "supervised", "--target y").out.find("c by y"));
}

TEST_F(McbinCategories, TablesTellOfEachCategoryOnRequest)
{
    ASSERT_EQ(0,
              RunOn(MakeCities(), "supervised", "--target bought --attributes city --format json >bins.json").exitCode);

    // Of Bonn's 12 rows 1 has bought, of all 60 there are 30: ln((1 / 30) / (11 / 30)) = -2.398.
    const Outcome shown = Run("show bins.json --categories");
    for (const char* words : {"  each category\n", "  {Bonn}         12   20.0%  11    1   8.3%  -2.398  0.7993",
                              "  {Aachen}       12   20.0%   1   11  91.7%  +2.398  0.7993"})
        EXPECT_NE(std::string::npos, shown.out.find(words)) << words << shown.out;
    EXPECT_EQ(std::string::npos, Run("show bins.json").out.find("{Bonn} "));
    EXPECT_EQ(Run("supervised data.csv --target bought --attributes city --categories").out, shown.out);
}
