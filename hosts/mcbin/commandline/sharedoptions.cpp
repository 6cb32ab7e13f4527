#include "hosts/mcbin/commandline/sharedoptions.h"

#include "bins/numbers.h"
#include "bins/tempdirectory.h"
#include "hosts/mcbin/helptexts.h"
#include "hosts/mcbin/input/delimiter.h"

#include <iterator>
#include <map>
#include <optional>

namespace
{

CLI::Validator MakeDelimiterCheck()
{
    return CLI::Validator([](const std::string& name)
                          { return ParseDelimiter(name) ? "" : "no delimiter is called '" + name + "'"; },
                          "", "");
}

void AddRounding(CLI::App& command, ColumnOptions& columns)
{
    for (const char* const name : {"--round", "--rounding"}) // the first is that of an earlier release
    {
        const bool isTold = std::string(name) == "--rounding";
        command
            .add_option_function<std::string>(
                name, [&columns](const std::string& how) { columns.rounding = *FindWeightRounding(how); },
                "Whether a weight becomes a whole number, and how. none, if not given: fractions count as they are, "
                "but for a last digit or two, to a grid on which all sums are exact; among a million rows a weight "
                "moves by less than one part in 10^9 of the largest")
            ->check(CLI::IsMember({"none", "truncate", "closest"}))
            ->option_text("none|truncate|closest")
            ->group(isTold ? "Columns" : "");
    }
    command
        .add_option_function<std::string>(
            "--weight-scale", [&columns](const std::string&) { columns.isWeightScaled = true; },
            "rows: weights are scaled to sum to the number of rows that have one above 0, so that the criterion sees "
            "as "
            "much evidence as there is; for those of a survey")
        ->check(CLI::IsMember({"rows"}))
        ->option_text("rows")
        ->group("Columns");
}

} // namespace

CLI::Validator MakeNameCheck()
{
    return CLI::Validator([](const std::string& name) { return name.empty() ? "the name is empty" : ""; }, "", "");
}

CLI::Validator MakeNumberCheck(double most, const std::string& words)
{
    return CLI::Validator(
        [most, words](const std::string& text)
        {
            const std::optional<double> number = ParseNumber(text);
            return number && *number >= 0.0 && *number <= most ? "" : "'" + text + "' is no number " + words;
        },
        "", "");
}

CLI::Option* AddRepeated(CLI::App& command, const std::string& name, std::vector<std::string>& list,
                         const std::string& description, const std::string& what)
{
    return command.add_option(name, list, description)->allow_extra_args(false)->option_text(what);
}

CLI::Option* AddList(CLI::App& command, const std::string& name, std::vector<std::string>& list,
                     const std::string& description, const std::string& what)
{
    return AddRepeated(command, name, list, description, what)->delimiter(',');
}

CLI::Option* AddName(CLI::App& command, const std::string& option, std::string& name, const std::string& description)
{
    return command.add_option(option, name, description)->check(MakeNameCheck())->option_text("NAME")->group("Columns");
}

void AddFormOfTable(CLI::App& command, TableOptions& table)
{
    command
        .add_option_function<std::string>(
            "--delimiter", [&table](const std::string& name) { table.delimiter = ParseDelimiter(name); },
            "What separates the fields: a character, or comma, tab, semicolon, bar; found out if not given")
        ->check(MakeDelimiterCheck())
        ->option_text("CHAR")
        ->group("Input");
    command
        .add_option_function<std::string>(
            "--decimal",
            [&table](const std::string& name) { table.decimal = name == "comma" || name == "," ? ',' : '.'; },
            "What stands before the fractions of numbers: point (the default) or comma")
        ->check(CLI::IsMember({".", ",", "point", "comma"}))
        ->option_text("point|comma")
        ->group("Input");
    command
        .add_option_function<std::string>(
            "--thousands",
            [&table](const std::string& name) {
                table.thousands = name == "point" ? '.' : name == "apostrophe" ? '\'' : ParseDelimiter(name);
            },
            "What may stand between groups of three digits: point, comma, space, apostrophe; nothing if not given. "
            "Numbers in other options are written as in 1234.5 all the same")
        ->check(CLI::IsMember({".", ",", " ", "'", "_", "point", "comma", "space", "apostrophe"}))
        ->option_text("point|comma|space|apostrophe")
        ->group("Input");
    command
        .add_flag_callback(
            "--no-header", [&table] { table.hasHeader = false; },
            "The first row is one of the data; the columns are called 'column 1', 'column 2' and so on")
        ->group("Input");
    command
        .add_option_function<std::string>(
            "--comment", [&table](const std::string& mark) { table.comment = mark.front(); },
            "Lines that begin with this character are none of the table")
        ->check(CLI::Validator(
            [](const std::string& mark)
            { return mark.size() == 1 && mark != "\"" ? "" : "'" + mark + "' is no single character, or a quote"; },
            "", ""))
        ->option_text("CHAR")
        ->group("Input");
}

void AddTable(CLI::App& command, TableOptions& table)
{
    command.add_option("DATA", table.file, kData)->required()->option_text("FILE");
    AddFormOfTable(command, table);
}

void AddMissing(CLI::App& command, std::vector<std::string>& missingText, bool& isBadMissing)
{
    AddList(command, "--missing-text", missingText,
            "Fields that stand for a missing value in every column, beside the empty one", "TEXT,...")
        ->group("Input");
    command
        .add_option_function<std::string>(
            "--bad", [&isBadMissing](const std::string& how) { isBadMissing = how == "missing"; },
            "What a field is that is no number in a column of numbers, and a negative or infinite weight: an error "
            "(the "
            "default), or missing")
        ->check(CLI::IsMember({"error", "missing"}))
        ->option_text("error|missing")
        ->group("Input");
}

void AddColumns(CLI::App& command, ColumnOptions& columns)
{
    AddRepeated(command, "--attributes", columns.attributes,
                "The columns to bin; names or patterns such as 'x_*', where 'x_[*]' is the name x_*. If not given, all "
                "columns of "
                "numbers and, with a target, of categories",
                "NAME,...")
        ->group("Columns");
    AddRepeated(command, "--exclude", columns.exclude, "Columns not to bin; names or patterns", "NAME,...")
        ->group("Columns");
    AddName(command, "--weight", columns.weight,
            "The column that tells how many cases a row stands for. A row without a weight is left out");
    AddRounding(command, columns);
    AddRepeated(command, "--categorical", columns.categorical,
                "Columns of categories, at most 256, also if they are numbers", "NAME,...")
        ->group("Columns");
    AddRepeated(command, "--category-order", columns.categoryOrder,
                "In which order the categories of attributes are cut, where they have none of their own. rate: by the "
                "rate of the target's second category, or along the first principal direction of the rates of several "
                "(the default with a target). text: by their bytes. COLUMN=a,b,c: that of one column; may be repeated",
                "rate|text|COLUMN=a,b,c")
        ->group("Columns");
    command
        .add_option("--rare", columns.rareShare,
                    "Categories of less than this share of the weight are one, \"(rare)\", to which unseen ones belong "
                    "as well, from 0 to 1; not of columns whose order is told")
        ->check(MakeNumberCheck(1.0, "from 0 to 1"))
        ->option_text("SHARE")
        ->group("Columns");
    AddRepeated(command, "--continuous", columns.continuous,
                "Columns of numbers, also if most fields are something else", "NAME,...")
        ->group("Columns");
    AddMissing(command, columns.missingText, columns.isBadMissing);
    AddRepeated(command, "--missing", columns.missing,
                "Texts and numbers of one column that count as missing, and at most one interval of them, both ends "
                "included; may be repeated",
                "COLUMN=9,90:99")
        ->group("Input");
}

void AddNumBins(CLI::App& command, BinOptions& options, const std::string& description)
{
    AddRenamed(command, "--n-bins", "--bins", options.settings.numBins, description, CLI::Range(2, kMost))
        ->option_text("N")
        ->group("Settings");
}

CLI::Option* AddClosed(CLI::App& command, Settings& settings)
{
    return command
        .add_option_function<std::string>(
            "--closed", [&settings](const std::string& side) { settings.isRightClosed = side == "right"; },
            "Which end of an interval belongs to it; right if not given")
        ->check(CLI::IsMember({"right", "left"}))
        ->option_text("right|left")
        ->group("Settings");
}

void AddTempDirectory(CLI::App& command, std::string& tempDirectory)
{
    command
        .add_option_function<std::string>(
            "--temp-dir", [&tempDirectory](const std::string& directory) { tempDirectory = directory; },
            "Where the temporary files go, which hold all records; the directory in TMPDIR, else /tmp, if not given")
        ->check(MakeNameCheck())
        ->option_text("DIR")
        ->group("Settings");
}

void AddSettings(CLI::App& command, BinOptions& options)
{
    AddClosed(command, options.settings);
    command
        .add_flag("--round-cuts", options.areCutsRounded,
                  "Make each cut point the shortest decimal between the values that it parts, which moves no record; "
                  "the table is read once more")
        ->group("Settings");
    AddTempDirectory(command, options.tempDirectory);
}

void SettleTempDirectory(std::string& tempDirectory)
{
    try
    {
        tempDirectory = ChooseTempDirectory(tempDirectory, "--temp-dir");
    }
    catch (const TempDirectoryUnusable& error)
    {
        throw CLI::ValidationError(error.what());
    }
}

void AddEncoding(CLI::App& command, Encoding& encoding, const std::string& when)
{
    std::map<std::string, Encoding> encodings(std::begin(kEncodingNames), std::end(kEncodingNames));
    command
        .add_option_function<std::string>(
            "--encode", [&encoding, encodings](const std::string& name) { encoding = encodings.at(name); },
            when + "what stands for a value: the number of its bin from 0 (the default), its label, or its weight of "
                   "evidence or rate, which a missing value has, too")
        ->check(CLI::IsMember({"number", "label", "woe", "rate"}))
        ->option_text("number|label|woe|rate")
        ->group("Output");
    command
        .add_flag_callback(
            "--labels", [&encoding] { encoding = Encoding::kLabel; }, when + "short for --encode label")
        ->group("Output");
}

void AddOutput(CLI::App& command, OutputOptions& output)
{
    command
        .add_option_function<std::string>(
            "--format",
            [&output](const std::string& name)
            {
                const std::map<std::string, Format> formats{{"table", Format::kTable},
                                                            {"html", Format::kHtml},
                                                            {"json", Format::kJson},
                                                            {"csv", Format::kCsv},
                                                            {"sql", Format::kSql}};
                output.format = formats.at(name);
            },
            "table: to read (the default), with control characters of the data as \\x0a. html: the page that --report "
            "writes. json: everything, for apply, show and other programs. csv: a row for each bin, the missing and "
            "the total. sql: a CASE expression for each attribute")
        ->check(CLI::IsMember({"table", "html", "json", "csv", "sql"}))
        ->option_text("table|html|json|csv|sql")
        ->group("Output");
    command
        .add_option_function<std::string>(
            "--dialect",
            [&output](const std::string& name)
            { output.sql.dialect = name == "duckdb" ? SqlDialect::kDuckDb : SqlDialect::kStandard; },
            "What --format sql is for: standard, for most databases (the default), or duckdb, where a NaN is missing, "
            "too")
        ->check(CLI::IsMember({"standard", "duckdb"}))
        ->option_text("standard|duckdb")
        ->group("Output");
    AddEncoding(command, output.sql.encoding, "With --format sql: ");
    command
        .add_flag("--cast", output.sql.isCast,
                  "With --format sql: the columns of numbers hold texts, as where a file was loaded as it is")
        ->group("Output");
    command
        .add_option("--select", output.sql.table,
                    "With --format sql: a whole SELECT from this table, which stands there as it is given")
        ->check(MakeNameCheck())
        ->option_text("TABLE")
        ->group("Output");
    command.add_option("--report", output.report, "Write a page with tables and charts, too")
        ->check(MakeNameCheck())
        ->check(CLI::Validator(
            [](const std::string& file) { return file == "-" ? "standard output is for the bins" : ""; }, "", ""))
        ->option_text("FILE.html")
        ->group("Output");
    command
        .add_flag("--categories", output.areCategoriesShown,
                  "With --format table: below the bins of an attribute of categories a row for each of them")
        ->group("Output");
    command.add_flag("--strict", output.isStrict, "End with exit code 3 if an attribute carries a warning or an error")
        ->group("Output");
}

void AddQuiet(CLI::App& command, bool& isQuiet)
{
    command.add_flag("--quiet", isQuiet, "Show no progress")->group("Output");
}
