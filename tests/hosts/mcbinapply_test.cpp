#include "hosts/mcbinrun.h"

#include <map>
#include <string>
#include <vector>

// Bins that are handed on and put to use: as JSON, by apply, and by SQL.

namespace
{

/// Rows with weights of 1, missing values of each kind, and values on cut points. The category "k1" to "k3" of the rows
/// rises with x, and "grade" with it.
std::string MakeCustomers()
{
    std::string data = "id,x,\"od\"\"d\",grade,y\n";
    for (int i = 0; i < 300; ++i)
    {
        const std::string x = i % 29 == 0 ? "" : i % 31 == 0 ? "?" : i % 37 == 0 ? "-9" : std::to_string(i / 2 * 0.5);
        const std::string grade = i % 41 == 0 ? "" : i < 120 ? "a" : i < 200 ? "b" : "c";
        const char* y = (i < 100) != (i % 17 == 0) ? "k1" : (i < 200) != (i % 13 == 0) ? "k2" : "k3";
        data += std::to_string(i) + "," + x + "," + std::to_string(i / 7) + "," + grade + "," + y + "\n";
    }
    return data;
}

constexpr const char* kOptions = "--target y --exclude id --categorical grade --missing-text '?' --missing x=-99:-1 ";

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
            if (c == delimiter)
                rows.back().emplace_back();
            else
                rows.back().back() += c;
    }
    return rows;
}

} // namespace

TEST_P(McbinApply, GivesTheWeightsOfTheTablesAndWhatTheSqlGives)
{
    const std::string closed = std::string(" --closed ") + GetParam();
    const Outcome json = RunOn(MakeCustomers(), "supervised", kOptions + closed + " --format json");
    Write("bins.json", json.out);
    Write("bins.sql", "CREATE TABLE t (id, x REAL, \"od\"\"d\" REAL, grade, y);\n.mode csv\n.import data.csv t\n"
                      "UPDATE t SET x = NULL WHERE x IN ('', '?');\nUPDATE t SET grade = NULL WHERE grade = '';\n"
                      "DELETE FROM t WHERE id = 'id';\nSELECT *, " +
                          Run("supervised data.csv " + (kOptions + closed) + " --format sql").out +
                          "FROM t ORDER BY CAST(id AS INTEGER);\n");

    const Outcome applied = Run("apply bins.json data.csv -o -");
    ASSERT_EQ(0, applied.exitCode) << json.err << applied.err;

    std::map<std::string, std::vector<int>> counts; // by column and bin
    const auto rows = Cells(applied.out);
    EXPECT_EQ(301u, rows.size());
    std::string bins;
    for (std::size_t i = 1; i < rows.size(); ++i)
        for (std::size_t column = 5; column < rows[i].size(); ++column)
        {
            bins += rows[i][column] + (column + 1 < rows[i].size() ? "," : "\n");
            if (rows[i][column].empty())
                continue;
            std::vector<int>& binCounts = counts[rows[0][column]];
            binCounts.resize(std::max<std::size_t>(binCounts.size(), std::stoul(rows[i][column]) + 1));
            ++binCounts[std::stoul(rows[i][column])];
        }
    std::map<std::string, std::vector<int>> tables;
    for (const auto& row :
         Cells(Run("supervised data.csv " + (kOptions + closed) + " --format csv | sed 's/, /;/g'").out))
        if (row[0] != "attribute")
            tables[(row[0] == "\"od\"\"d\"" ? "\"od\"\"d_bin\"" : row[0] + "_bin")].push_back(std::stoi(row[7]));
    EXPECT_EQ(3u, tables.size());
    EXPECT_EQ(tables, counts);
    EXPECT_EQ(bins, Shell("sqlite3 :memory: <bins.sql | cut -d, -f6- | tr -d '\\r'").out);
}

INSTANTIATE_TEST_SUITE_P(Closed, McbinApply, testing::Values("right", "left"));
