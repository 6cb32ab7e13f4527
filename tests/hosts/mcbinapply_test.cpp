#include "tests/hosts/mcbinrun.h"

#include <map>
#include <string>
#include <vector>

// Bins that are handed on and put to use: as JSON, by apply, and by SQL.

namespace
{

std::string PickGrade(int row)
{
    return row % 41 == 0 ? "" : row % 43 == 0 ? "it's" : row < 120 ? "a" : row < 200 ? "b" : "unknown";
}

std::string PickX(int row)
{
    return row % 29 == 0   ? ""
           : row % 31 == 0 ? "?"
           : row % 37 == 0 ? "-9"
           : row % 41 == 0 ? "-9.0"
           : row % 43 == 0 ? "unknown"
                           : std::to_string(row / 2 * 0.5);
}

/// Rows with weights, missing values of each kind, and values on cut points. The category "k1" to "k3" of the rows
/// rises with x, and "grade" with it. What is missing in x is a category of grade.
std::string MakeCustomers()
{
    std::string data = "id,x,\"od\"\"d\",grade,y,w\n";
    for (int i = 0; i < 300; ++i)
    {
        const char* y = (i < 100) != (i % 17 == 0) ? "k1" : (i < 200) != (i % 13 == 0) ? "k2" : "k3";
        data += std::to_string(i) + "," + PickX(i) + "," + std::to_string(i / 7) + "," + PickGrade(i) + "," + y + "," +
                std::to_string(i % 4) + "\n";
    }
    return data;
}

constexpr const char* kOptions =
    "--target y --exclude id --categorical grade --missing-text '?,-9' --missing x=unknown "
    "--missing '*d=7,9,30:32' --missing grade=\"it's\" --weight w ";

class McbinApply : public Mcbin, public testing::WithParamInterface<const char*>
{
};

std::vector<std::vector<std::string>> Cells(const std::string& csv, char delimiter = ',')
{
    std::vector<std::vector<std::string>> rows;
    std::istringstream lines(csv);
    for (std::string line; std::getline(lines, line);)
    {
        rows.emplace_back(1);
        for (const char c : line)
        {
            if (c == delimiter)
                rows.back().emplace_back();
            else
                rows.back().back() += c;
        }
    }
    return rows;
}

} // namespace

TEST_P(McbinApply, GivesTheWeightsOfTheTablesAndWhatTheSqlGives)
{
    const std::string closed = std::string(" --closed ") + GetParam();
    const Outcome json = RunOn(MakeCustomers(), "supervised", kOptions + closed + " --format json");
    Write("bins.json", json.out);
    Write("bins.sql",
          "CREATE TABLE t (id, x REAL, \"od\"\"d\" REAL, grade, y, w INTEGER);\n.mode csv\n.import data.csv t\n"
          "UPDATE t SET x = NULL WHERE x IN ('', '?', 'unknown');\nUPDATE t SET grade = NULL WHERE grade = '';\n"
          "DELETE FROM t WHERE id = 'id';\nSELECT *, " +
              Run("supervised data.csv " + (kOptions + closed) + " --format sql").out +
              "FROM t ORDER BY CAST(id AS INTEGER);\n");

    const Outcome applied = Run("apply bins.json data.csv -o -");
    ASSERT_EQ(0, applied.exitCode) << json.err << applied.err;

    std::map<std::string, std::vector<int>> weights; // by column and bin
    const auto rows = Cells(applied.out);
    EXPECT_EQ(301u, rows.size());
    std::string bins;
    for (std::size_t i = 1; i < rows.size(); ++i)
    {
        for (std::size_t column = 6; column < rows[i].size(); ++column)
        {
            bins += rows[i][column] + (column + 1 < rows[i].size() ? "," : "\n");
            if (rows[i][column].empty())
                continue;
            std::vector<int>& binWeights = weights[rows[0][column]];
            binWeights.resize(std::max<std::size_t>(binWeights.size(), std::stoul(rows[i][column]) + 1));
            binWeights[std::stoul(rows[i][column])] += std::stoi(rows[i][5]);
        }
    }
    std::map<std::string, std::vector<int>> tables;
    for (const auto& row :
         Cells(Run("supervised data.csv " + (kOptions + closed) + " --format csv | sed 's/, /;/g'").out))
    {
        const bool isBin = row[2].find_first_not_of("0123456789") == std::string::npos;
        if (isBin)
            tables[(row[0] == "\"od\"\"d\"" ? "\"od\"\"d_bin\"" : row[0] + "_bin")].push_back(std::stoi(row[7]));
    }
    EXPECT_EQ(3u, tables.size());
    EXPECT_EQ(tables, weights);
    EXPECT_EQ(bins, Shell("sqlite3 :memory: <bins.sql | cut -d, -f7- | tr -d '\\r'").out);
}

INSTANTIATE_TEST_SUITE_P(Closed, McbinApply, testing::Values("right", "left"));

TEST_F(Mcbin, AppliesWhatThePythonPackageHasWritten)
{
    // Numeric categories and a label, which the tool itself doesn't write, and a member that it doesn't know.
    Write("bins.json", R"({"schema": "mcobnqrt-bins", "schema_version": 1, "component_version": "", "new": [],
      "method": "equal-frequency",
      "settings": {"closed": "left", "bins": 3, "distinct_threshold": null, "small_bins": null},
      "data": {"name": null, "records": null, "missing_text": []},
      "variables": [{"name": "grade", "label": "of the paper", "kind": "numeric-categorical", "role": "attribute",
                     "categories": [1, 1.5, 2, 30], "rounding": null, "missing": {"values": [9], "interval": ["-inf", -2]}},
                    {"name": "grade", "label": "", "kind": "weight", "role": "weight", "categories": null,
                     "rounding": "none", "missing": {"values": [], "interval": null}}],
      "status": {"code": 0, "severity": "ok", "words": "OK", "discrete": [0, 0, 0], "scale": [0, 0, 0]},
      "results": [{"attribute": "grade", "target": null,
                   "status": {"code": 0, "severity": "ok", "words": "OK", "discrete": [0, 0, 0], "scale": [0, 0, 0]},
                   "distinct_values": 4, "weight": 40, "weight_with_missing": 41, "minimum": 0, "maximum": 3,
                   "target_entropy": null, "model_entropy": null, "cut_points": [1, 3],
                   "bins": [{"left": "-inf", "right": 1, "weight": 10, "weights": null},
                            {"left": 1, "right": 3, "weight": 20.5, "weights": null},
                            {"left": 3, "right": "inf", "weight": 10, "weights": null}]}]})");

    EXPECT_EQ(
        "grade\n{1}\n{1}\n\"{1.5, 2}\"\n{30}\n\"\"\n\"\"\n\"\"\n",
        RunOn("grade\n1\n1.0\n2\n3e1\n9\n-3\nx\n", "apply bins.json", "--labels --in-place-columns --bad missing").out);
    EXPECT_EQ(
        "mcbin: data.csv, line 2: column 'grade': '3' is a category that the bins don't know; with --bad missing it "
        "counts as missing\n",
        RunOn("grade\n3\n", "apply bins.json", "").err);
}

TEST_F(Mcbin, ReadsTheVersionOfItsFilesWhereMissingTextsOfAColumnStandAmongThoseOfAll)
{
    // What that version wrote of a column x with --missing x=unknown and --missing-text=-9, and of a target whose last
    // category is in a row without weight.
    Write("bins.json", R"({"schema": "mcobnqrt-bins", "schema_version": 1, "component_version": "",
      "method": "supervised",
      "settings": {"closed": "right", "bins": 1000, "distinct_threshold": null, "small_bins": 0},
      "data": {"name": null, "records": null, "missing_text": ["-9", "unknown"]},
      "variables": [{"name": "x", "label": "", "kind": "continuous", "role": "attribute",
                     "categories": null, "rounding": null, "missing": {"values": [], "interval": null}},
                    {"name": "y", "label": "", "kind": "string-categorical", "role": "target",
                     "categories": ["a", "b", "z"], "rounding": null, "missing": {"values": [], "interval": null}}],
      "status": {"code": 0, "severity": "ok", "words": "OK", "discrete": [0, 0, 0], "scale": [0, 0, 0]},
      "results": [{"attribute": "x", "target": "y",
                   "status": {"code": 0, "severity": "ok", "words": "OK", "discrete": [0, 0, 0], "scale": [0, 0, 0]},
                   "distinct_values": 20, "weight": 20, "weight_with_missing": 20, "minimum": 1, "maximum": 20,
                   "target_entropy": 1, "model_entropy": 0, "cut_points": [10],
                   "bins": [{"left": "-inf", "right": 10, "weight": 10, "weights": [10, 0]},
                            {"left": 10, "right": "inf", "weight": 10, "weights": [0, 10]}]}]})");

    EXPECT_EQ("x,x_bin\n10,0\n11,1\n-9.0,\nunknown,\n", RunOn("x\n10\n11\n-9.0\nunknown\n", "apply bins.json", "").out);
}

TEST_F(Mcbin, CopiesWhatItDoesNotMakeByteByByte)
{
    std::string train = "x,y\n";
    for (int i = 0; i < 20; ++i) train += std::to_string(i) + (i < 10 ? ",a\n" : ",b\n");
    ASSERT_EQ(0, RunOn(train, "supervised", "--target y --format json >bins.json").exitCode);
    struct Case
    {
        const char* data;
        const char* added;
        const char* replaced;
    };
    const Case cases[] = {
        {"x, t ,\"u\"\n 1\t, a b ,\"c\"\n", "x, t ,\"u\",x_bin\n 1\t, a b ,\"c\",0\n", "x, t ,\"u\"\n0, a b ,\"c\"\n"},
        {"x,t\r\n\r\n1,\"a\r\n\"\"b\n\"\r\n  \n19,", "x,t,x_bin\r\n1,\"a\r\n\"\"b\n\",0\r\n19,,1\r\n",
         "x,t\r\n0,\"a\r\n\"\"b\n\"\r\n1,\r\n"},
        {"\xEF\xBB\xBFt;x\r \"a;b\" ; \"19\" \rc;1\n", "\xEF\xBB\xBFt;x;x_bin\r \"a;b\" ; \"19\" ;1\rc;1;0\n",
         "\xEF\xBB\xBFt;x\r \"a;b\" ;1\rc;0\n"},
        {"x\n\"\"\n\"1\"", "x,x_bin\n\"\",\n\"1\",0\n", "x\n\"\"\n0\n"},
    };
    for (const Case& c : cases)
    {
        EXPECT_EQ(c.added, RunOn(c.data, "apply bins.json", "").out) << ReadFile(fData.File("err"));
        EXPECT_EQ(c.replaced, RunOn(c.data, "apply bins.json", "--in-place-columns").out);
    }

    // The first 65536 bytes end between CR and LF.
    const std::string name = "\"" + std::string(65536 - 5, 't') + "\"";
    EXPECT_TRUE("x," + name + ",x_bin\r\n1,,0\r\n" == RunOn("x," + name + "\r\n1,\r\n", "apply bins.json", "").out);

    // Larger than any buffer, with a part of a row at the end of each.
    for (const std::string end : {"\n", "\r\n", "\r"})
    {
        std::string data = "t,x" + end;
        std::string expected = "t,x,x_bin" + end;
        for (int i = 0; i < 9000; ++i)
        {
            const std::string row =
                (i % 3 == 0 ? " a" + std::string(static_cast<std::size_t>(i) % 50, 'b') : "\"\"\",\r\n\" ") + "," +
                std::to_string(i % 20);
            data += row + end;
            expected += row + (i % 20 < 10 ? ",0" : ",1") + end;
        }
        EXPECT_TRUE(expected == RunOn(data, "apply bins.json", "").out) << "rows that end with " << end;
    }
}

TEST_F(Mcbin, AppliesToOtherColumnsInAnotherOrderAndSaysWhatDoesNotFit)
{
    std::string data = "a,b,p,q\n";
    for (int i = 0; i < 40; ++i)
        data += std::to_string(i) + "," + std::to_string(-i) + (i < 20 ? ",no" : ",yes") + (i < 10 ? ",lo\n" : ",hi\n");
    ASSERT_EQ(0, RunOn(data, "supervised", "--pairs a:p,b:p,b:q --format json >bins.json").exitCode);

    // The names tell the targets apart; a column without a name stays one; values far outside are in the outer bins.
    EXPECT_EQ("b;;a;a_by_p_bin;b_by_p_bin;b_by_q_bin\n -15 ;\"x;\"\"y\";1e9;1;1;0\n;;19;0;;\n",
              RunOn("b;;a\n -15 ;\"x;\"\"y\";1e9\n;;19\n", "apply bins.json", "").out);
    EXPECT_EQ("mcbin: column 'b' has been binned for more than one target, so its bins can't take its place\n",
              RunOn(data, "apply bins.json", "--in-place-columns").err);
    EXPECT_EQ("a,b,b_by_q_bin,a_by_p_bin,b_by_p_bin,b_by_q_bin_2\n1,2,3,0,1,1\n",
              RunOn("a,b,b_by_q_bin\n1,2,3\n", "apply bins.json", "").out);
    // Read once, both may be pipes.
    Write("data.csv", "a,b\n1,-1\n");
    EXPECT_EQ("a,b,a_by_p_bin,b_by_p_bin,b_by_q_bin\n1,-1,0,1,1\n",
              Shell("mkfifo pipe; cat bins.json >pipe & cat data.csv | mcbin apply pipe -").out);
}
