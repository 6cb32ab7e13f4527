// The forms in which bins leave a host: JSON, CSV and SQL.

#include "bins/csv.h"
#include "bins/json.h"
#include "bins/jsonvalue.h"
#include "bins/sql.h"

#include "tests/support/samplebins.h"

#include <gtest/gtest.h>

#include <functional>
#include <limits>

namespace
{

constexpr double kInfinity = std::numeric_limits<double>::infinity();

/// Two results, with something of every kind that the form has.
Bins ManyThings()
{
    const auto age = AVariable("age \"in years\"");
    age->label = "\xC3\xA9\x01";
    age->missingNumbers = {999, -kInfinity};
    age->missingTexts = {"unknown"};
    age->missingInterval = {-kInfinity, -1.0};
    const auto colour = AVariable("colour", VariableKind::kStringCategorical, {"it's", "red"});
    colour->missingTexts = {"none"};
    const auto bought = AVariable("bought", VariableKind::kNumericCategorical, {"0", "2.5"});
    bought->role = VariableRole::kTarget;
    const auto weight = AVariable("weight", VariableKind::kWeight);
    weight->role = VariableRole::kWeight;
    weight->rounding = WeightRounding::kClosest;
    weight->weightGrid = 0.125;
    const auto day = AVariable("day");
    day->valueKind = ValueKind::kDate;
    Bins bins;
    bins.componentVersion = "1.0";
    bins.settings = {Method::kSupervised, true, 1000, 50, 0.25};
    bins.dataName = "people.csv";
    bins.numRecords = 14;
    bins.numRecordsWithoutWeight = 2;
    bins.missingTexts = {"NA"};
    bins.variables = {age, colour, bought, weight, day};
    bins.status = MCBinning::MCStatus(MCBinning::BINStatusSomeResultsFlagged, true);
    bins.results = {SomeBins(age, bought, {-kInfinity, 26.5}, {{6, 0.1}, {0, 1e300}, {1, 2}}),
                    SomeBins(colour, bought, {0.5}, {{6, 2}, {3, 1}})};
    bins.results[0].minimum = -kInfinity;
    bins.results[0].maximum = 70.25;
    bins.results[0].modelEntropy = 0.1;
    bins.results[0].numDistinct = 12;
    bins.results[0].missing = Bin{0.0, 0.0, 1.5, {1.5, 0.0}};
    bins.results[1].status = MCBinning::MCStatus(MCBinning::BINStatusNoCutPoints, true);
    bins.results[1].status.SetDiscreteDatum(1, -7);
    bins.results[1].status.SetScaleDatum(2, std::numeric_limits<double>::quiet_NaN());
    bins.reduction = Reduction{"DuckDB", "", 7, false, {12, 2}};
    return bins;
}

/// The value at the path, whose numbers are indices of elements.
JsonValue& At(JsonValue& document, const std::vector<std::string>& path)
{
    JsonValue* value = &document;
    for (const std::string& step : path)
    {
        if (auto* const array = std::get_if<JsonValue::Array>(&value->held))
            value = &array->at(static_cast<std::size_t>(std::stoi(step)));
        else
        {
            for (JsonValue::Member& member : std::get<JsonValue::Object>(value->held))
            {
                if (member.name == step)
                    value = &member.value;
            }
        }
    }
    return *value;
}

std::string FaultOf(const JsonValue& document)
{
    try
    {
        ReadBins(document);
    }
    catch (const JsonFault& fault)
    {
        return fault.what();
    }
    return "none";
}

Bins OneResult(AttributeBins result)
{
    Bins bins;
    bins.results.push_back(std::move(result));
    return bins;
}

} // namespace

TEST(BinsAsJson, AreReadBackToTheLastBit)
{
    const Bins bins = ManyThings();
    EXPECT_EQ(ToJson(bins), ToJson(ReadBins(MakeDocument(bins))));
    EXPECT_EQ(ToJson(Bins()), ToJson(ReadBins(MakeDocument(Bins()))));
}

TEST(BinsAsJson, ObjectsStandOnLinesOfTheirOwnAndNumbersAreShort)
{
    const std::string json = ToJson(ManyThings());
    for (const char* const part : {
             "{\"closed\": \"right\", \"n_bins\": 1000, \"max_distinct\": 50, \"small_bin_ratio\": 0.25, "
             "\"smoothing\": 0.5},\n",
             "      \"name\": \"age \\\"in years\\\"\",\n      \"label\": \"\xC3\xA9\\u0001\",\n",
             "{\"values\": [999, \"-inf\"], \"texts\": [\"unknown\"], \"interval\": [\"-inf\", -1]}",
             "      \"categories\": [0, 2.5],\n",
             "{\"engine\": \"DuckDB\", \"reason\": null, \"queries\": 7, \"distinct\": \"approximate\", "
             "\"groups\": [12, 2]},\n",
             "{\"left\": 26.5, \"right\": \"inf\", \"weight\": 3, \"weights\": [1, 2], \"rate\": ",
             "\"discrete\": [0, -7, 0], \"scale\": [0, 0, \"nan\"]}",
         })
        EXPECT_NE(std::string::npos, json.find(part)) << part << "\nis not in\n" << json;
}

TEST(BinsAsJson, FaultsNameTheirPlace)
{
    struct Case
    {
        std::vector<std::string> path;
        JsonValue value;
        const char* fault;
    };
    const Case cases[] = {
        {{"schema"}, "bins", "this is not a document of bins"},
        {{"schema_version"}, 4, "schema_version: version 4 is not known here, but those up to 3 are"},
        {{"schema_version"}, 2.5, "schema_version: '2.5' stands where a whole number should be"},
        {{"settings"}, 1, "settings: '1' stands where an object should be"},
        {{"settings", "closed"}, "up", "settings.closed: 'up' is not known here"},
        {{"settings", "n_bins"},
         std::int64_t{1} << 40,
         "settings.n_bins: 1099511627776 is not from -2147483648 to 2147483647"},
        {{"variables", "1", "categories", "0"}, 3, "variables[1].categories[0]: '3' stands where a text should be"},
        {{"variables", "3", "rounding"}, "up", "variables[3].rounding: 'up' is not known here"},
        {{"variables", "0", "missing", "interval"},
         JsonValue::Array{1},
         "variables[0].missing.interval: an interval has two ends"},
        {{"status", "scale"}, JsonValue::Array{1}, "status: a status has three slots of each kind"},
        {{"reduction", "groups"},
         JsonValue::Array{1},
         "reduction.groups: there must be a number of groups for each result"},
        {{"reduction", "distinct"}, "roughly", "reduction.distinct: 'roughly' is not known here"},
        {{"results"}, "x", "results: '\"x\"' stands where a list should be"},
        {{"results", "0", "attribute"}, "weight", "results[0].attribute: there is no variable 'weight'"},
        {{"results", "0", "cut_points"}, JsonValue::Array{1, 1}, "results[0].cut_points: cut points must rise"},
        {{"results", "0", "cut_points", "1"}, "nan", "results[0].cut_points: cut points must rise"},
        {{"results", "0", "cut_points", "1"}, 27, "results[0].bins[1]: the bin does not lie between its cut points"},
        {{"results", "1", "bins"},
         JsonValue::Array(),
         "results[1].bins: there must be one bin more than there are cut points"},
        {{"results", "0", "missing", "weights"},
         JsonValue::Array{1},
         "results[0].missing.weights: there must be a weight for each category of the target"},
        {{"results", "1", "bins", "1", "weights"},
         JsonValue::Array{1},
         "results[1].bins[1].weights: there must be a weight for each category of the target"},
    };
    for (const Case& c : cases)
    {
        JsonValue document = MakeDocument(ManyThings());
        At(document, c.path) = c.value;
        std::string fault = FaultOf(document);
        EXPECT_EQ(c.fault, fault);
    }
    JsonValue document = MakeDocument(ManyThings());
    std::get<JsonValue::Object>(At(document, {"results", "1"}).held)
        .erase(std::get<JsonValue::Object>(At(document, {"results", "1"}).held).begin());
    EXPECT_EQ("results[1]: the member 'attribute' is missing", FaultOf(document));
}

TEST(BinsAsCsv, HaveARowForEachBin)
{
    Bins bins = ManyThings();
    bins.results.erase(bins.results.begin());
    EXPECT_EQ("attribute,target,bin,label,left,right,closed,weight,share,rate,woe,iv,weight:0,weight:2.5\n"
              "colour,bought,0,{it's},-inf,0.5,right,8,0.6666666666666666,0.25,0,0,6,2\n"
              "colour,bought,1,{red},0.5,inf,right,4,0.3333333333333333,0.25,0,0,3,1\n"
              "colour,bought,total,total,,,right,12,1,0.25,0,0,9,3\n",
              ToCsv(bins));
    bins.results[0].missing = Bin{0.0, 0.0, 3.0, {3.0, 0.0}};
    bins.results[0].smoothing = 0.0;
    EXPECT_NE(std::string::npos, ToCsv(bins).find("colour,bought,missing,missing,,,right,3,0.2,0,-inf,inf,3,0\n"))
        << ToCsv(bins);
    EXPECT_EQ("\" a\"", QuoteField(" a", ','));
    EXPECT_EQ("\"a\"\"b;\"", QuoteField("a\"b;", ';'));
    EXPECT_EQ("a;b", QuoteField("a;b", ','));
}

TEST(BinsAsSql, MissingValuesComeFirstAndInfinitiesLieBeyondTheLargestNumber)
{
    Bins bins = ManyThings();
    EXPECT_EQ(
        "CASE\n"
        "  WHEN \"age \"\"in years\"\"\" IS NULL OR \"age \"\"in years\"\"\" IN (999) OR \"age \"\"in years\"\"\" < "
        "-1.7976931348623157e+308 OR \"age \"\"in years\"\"\" <= -1 THEN NULL\n"
        "  WHEN \"age \"\"in years\"\"\" < -1.7976931348623157e+308 THEN 0\n"
        "  WHEN \"age \"\"in years\"\"\" <= 26.5 THEN 1\n"
        "  ELSE 2\n"
        "END AS \"age \"\"in years\"\"_bin\",\n"
        "CASE\n"
        "  WHEN \"colour\" IS NULL OR \"colour\" IN ('none') THEN NULL\n"
        "  WHEN \"colour\" IN ('it''s') THEN 0\n"
        "  WHEN \"colour\" IN ('red') THEN 1\n"
        "  ELSE NULL\n"
        "END AS \"colour_bin\"\n",
        ToSql(bins, {}));
    EXPECT_EQ("", ToSql(Bins(), {}));
}

TEST(BinsAsSql, LiteralsAreOfTheKindOfTheColumn)
{
    const auto day = AVariable("d");
    day->valueKind = ValueKind::kDate;
    day->missingNumbers = {0};
    EXPECT_EQ("CASE\n"
              "  WHEN \"d\" IS NULL OR \"d\" IN (CAST('1970-01-01' AS DATE)) THEN NULL\n"
              "  WHEN \"d\" < CAST('1970-01-03' AS DATE) THEN 0\n"
              "  ELSE 1\n"
              "END AS \"d_bin\"\n",
              ToSql(OneResult(SomeBins(day, nullptr, {1.5}, {{1}, {1}}, false)),
                    {SqlDialect::kDuckDb, Encoding::kNumber, false, ""}));

    const auto flag = AVariable("f");
    flag->valueKind = ValueKind::kBoolean;
    EXPECT_EQ("CASE\n"
              "  WHEN \"f\" IS NULL THEN NULL\n"
              "  WHEN \"f\" = FALSE THEN '(-inf, 0.5]'\n"
              "  WHEN \"f\" = TRUE THEN '(0.5, +inf)'\n"
              "  ELSE NULL\n"
              "END AS \"f_bin\"\n",
              ToSql(OneResult(SomeBins(flag, nullptr, {0.5}, {{1}, {1}})),
                    {SqlDialect::kDuckDb, Encoding::kLabel, false, ""}));

    const auto number = AVariable("x");
    number->missingInterval = {-kInfinity, kInfinity};
    EXPECT_EQ(
        "CASE\n"
        "  WHEN \"x\" IS NULL OR isnan(\"x\") OR 1 = 1 THEN NULL\n"
        "  ELSE 0\n"
        "END AS \"x_bin\"\n",
        ToSql(OneResult(SomeBins(number, nullptr, {}, {{1}})), {SqlDialect::kDuckDb, Encoding::kNumber, false, ""}));
}
