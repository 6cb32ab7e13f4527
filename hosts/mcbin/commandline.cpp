#include "hosts/mcbin/commandline.h"

#include "bins/numbers.h"
#include "bins/tempdirectory.h"
#include "bins/text.h"
#include "hosts/mcbin/helptexts.h"
#include "hosts/mcbin/input/delimiter.h"
#include "hosts/mcbin/manpage.h"
#include "hosts/mcbin/spelling.h"

#include <mcobnqrt/binfactory.h>
#include <mcobnqrt/binsettings.h>
#include <mcobnqrt/binvarlist.h>
#include <mcobnqrt/ibinalgorithm.h>

#include <CLI/CLI.hpp>

#include <algorithm>
#include <limits>
#include <map>
#include <memory>
#include <optional>
#include <sstream>
#include <string>
#include <vector>

namespace
{

constexpr int kMost = std::numeric_limits<int>::max();

/// A supervised run refuses to work without a number of bins, but uses it for pre-binning alone, which is off as long
/// as no distinct value threshold is set. With 1000 bins pre-binning costs hardly any precision: a border is off by a
/// thousandth of the weight at most.
constexpr int kPreBins = 1000;

CLI::Validator MakeDelimiterCheck()
{
    return CLI::Validator([](const std::string& name)
                          { return ParseDelimiter(name) ? "" : "no delimiter is called '" + name + "'"; },
                          "", "");
}

/// For names that have no meaning if they are empty, as from a variable of a shell that isn't set: they would seem not
/// to be given.
CLI::Validator MakeNameCheck()
{
    return CLI::Validator([](const std::string& name) { return name.empty() ? "the name is empty" : ""; }, "", "");
}

/// CLI::Range lets a NaN pass.
/// Refuses what is no finite number from 0 to `most`, which `words` tell of.
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

/// A list that may be given by repeating the option; it doesn't swallow what follows.
CLI::Option* AddRepeated(CLI::App& command, const std::string& name, std::vector<std::string>& list,
                         const std::string& description, const std::string& what)
{
    return command.add_option(name, list, description)->allow_extra_args(false)->option_text(what);
}

/// A list that may be given by repeating the option, or with commas. A list of names of columns is not for this: names
/// may hold commas, so these lists are split where the columns are known.
CLI::Option* AddList(CLI::App& command, const std::string& name, std::vector<std::string>& list,
                     const std::string& description, const std::string& what)
{
    return AddRepeated(command, name, list, description, what)->delimiter(',');
}

/// The name of one column.
CLI::Option* AddName(CLI::App& command, const std::string& option, std::string& name, const std::string& description)
{
    return command.add_option(option, name, description)->check(MakeNameCheck())->option_text("NAME")->group("Columns");
}

/// An option that also goes by the name of an earlier release, which the help doesn't tell.
template<class Value>
CLI::Option* AddRenamed(CLI::App& command, const std::string& name, const std::string& earlierName, Value& value,
                        const std::string& description, const CLI::Validator& check)
{
    command.add_option(earlierName, value)->check(check)->group("");
    return command.add_option(name, value, description)->check(check);
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
    AddTempDirectory(command, options.tempDirectory);
}

/// A temporary directory that can't be used ends the tool as any other wrong use of it does.
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

/// `when` tells in which form of output it counts.
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
            "the "
            "total. sql: a CASE expression for each attribute")
        ->check(CLI::IsMember({"table", "html", "json", "csv", "sql"}))
        ->option_text("FORMAT")
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

void AddSupervised(CLI::App& app, Request& request)
{
    CLI::App& command = *app.add_subcommand(
        "supervised", "Cut the columns of numbers where they separate the categories of a target best");
    AddTable(command, request.bin.table);
    CLI::Option* const target =
        AddName(command, "--target", request.bin.columns.target,
                "The column whose categories are to be separated, from 2 to 256; a column of numbers is cut into bins "
                "first, as the last example shows");
    CLI::Option* const pairs =
        AddList(command, "--pairs", request.bin.columns.pairs,
                "Several targets in one pass: what is to be binned for which; the attribute may be a pattern",
                "ATTRIBUTE:TARGET,...")
            ->group("Columns");
    pairs->excludes(target);
    AddColumns(command, request.bin.columns);
    for (const char* const name : {"--attributes", "--exclude"}) pairs->excludes(command.get_option(name));
    Settings& settings = request.bin.settings;
    AddRenamed(
        command, "--max-distinct", "--distinct-threshold", settings.maxDistinct,
        "An attribute with more distinct values is first cut into --n-bins bins of equal frequency; never if not "
        "given",
        CLI::Range(0, kMost))
        ->option_text("N")
        ->group("Settings");
    AddNumBins(command, request.bin, "The number of bins for that; 1000 if not given");
    AddRenamed(command, "--small-bin-ratio", "--small-bins", settings.smallBinRatio,
               "An inner bin of less than this share of its lighter neighbour's weight is merged, from 0 to 1",
               MakeNumberCheck(1.0, "from 0 to 1"))
        ->option_text("RATIO")
        ->group("Settings");
    command
        .add_option("--smoothing", settings.smoothing,
                    "Added to the weights of a bin's events and others for the WoE, where one of them is 0; 0.5 if not "
                    "given, and with 0 such a WoE is infinite")
        ->check(MakeNumberCheck(std::numeric_limits<double>::max(), "from 0"))
        ->option_text("WEIGHT")
        ->group("Settings");
    AddSettings(command, request.bin);
    AddOutput(command, request.bin.output);
    AddQuiet(command, request.bin.output.isQuiet);
    command.footer(kSupervisedExamples);
    command.callback(
        [&request, target, pairs]
        {
            if (target->empty() && pairs->empty())
                throw CLI::RequiredError("--target, or --pairs,");
            request.command = Request::Command::kSupervised;
            request.bin.settings.method = Method::kSupervised;
            SettleTempDirectory(request.bin.tempDirectory);
            request.bin.columns.areTextsBinned = true;
            if (request.bin.settings.numBins == 0)
                request.bin.settings.numBins = kPreBins;
            request.bin.settings.smallBinRatio = request.bin.settings.smallBinRatio.value_or(0.0);
        });
}

void AddEqualFrequency(CLI::App& app, Request& request)
{
    constexpr int kUsualBins = 10;
    CLI::App& command =
        *app.add_subcommand("equal-frequency", "Cut the columns of numbers into bins of about equal weight");
    AddTable(command, request.bin.table);
    AddColumns(command, request.bin.columns);
    AddNumBins(command, request.bin, "The number of bins to aim at; 10 if not given");
    AddSettings(command, request.bin);
    AddOutput(command, request.bin.output);
    AddQuiet(command, request.bin.output.isQuiet);
    command.footer(kEqualFrequencyExamples);
    command.callback(
        [&request]
        {
            request.command = Request::Command::kEqualFrequency;
            request.bin.settings.method = Method::kEqualFrequency;
            SettleTempDirectory(request.bin.tempDirectory);
            const std::vector<std::string>& orders = request.bin.columns.categoryOrder;
            if (std::find(orders.begin(), orders.end(), "rate") != orders.end())
                throw CLI::ValidationError("--category-order: rate needs a target");
            if (request.bin.settings.numBins == 0)
                request.bin.settings.numBins = kUsualBins;
        });
}

void AddBins(CLI::App& command, std::string& bins)
{
    command.add_option("BINS", bins, "The bins, as --format json has written them")
        ->required()
        ->option_text("BINS.json");
}

void AddShow(CLI::App& app, Request& request)
{
    CLI::App& command = *app.add_subcommand("show", "Show bins that were found before, in another form");
    AddBins(command, request.show.bins);
    AddOutput(command, request.show.output);
    command.footer(kShowExamples);
    command.callback([&request] { request.command = Request::Command::kShow; });
}

/// Without bins the data stand alone, and cut points make the bins.
void SettleEvaluation(EvaluateOptions& options, const std::vector<std::string>& files)
{
    const std::size_t numWanted = options.cuts.empty() ? 2 : 1;
    if (files.size() != numWanted)
    {
        throw CLI::ValidationError(options.cuts.empty() ? "BINS.json and DATA are needed, or --cuts and DATA"
                                                        : "with --cuts there is only DATA, as these make the bins");
    }
    if (options.output.format == Format::kSql)
        throw CLI::ValidationError("--format: an evaluation has no form in SQL; 'mcbin show' has one of its bins");
    options.bins = options.cuts.empty() ? files.front() : "";
    options.table.file = files.back();
    SettleTempDirectory(options.tempDirectory);
}

void AddEvaluate(CLI::App& app, Request& request)
{
    EvaluateOptions& options = request.evaluate;
    CLI::App& command = *app.add_subcommand(
        "evaluate", "Count a file in bins that were found before, and tell how far it has moved from their data");
    const auto files = std::make_shared<std::vector<std::string>>();
    command
        .add_option("FILES", *files,
                    "The bins, as --format json has written them, whose cut points may have been "
                    "edited since; and the data, a delimited text file or - for standard input")
        ->required()
        ->option_text("[BINS.json] DATA");
    AddFormOfTable(command, options.table);
    AddRepeated(command, "--cuts", options.cuts,
                "Makes the bins of cut points alone, without a file of bins; may be repeated", "COLUMN=18,25,40")
        ->group("Columns");
    AddName(command, "--target", options.columns.target,
            "The column of the target, if it is not called as it was; without such a column rates are left out");
    AddName(command, "--weight", options.columns.weight, "The column of the weight, if it is not called as it was");
    AddMissing(command, options.columns.missingText, options.columns.isBadMissing);
    command
        .add_option_function<std::string>(
            "--save", [&options](const std::string& file) { options.save = file; },
            "Write the bins as they were counted, too, as --format json writes bins")
        ->check(MakeNameCheck())
        ->option_text("FILE.json")
        ->group("Output");
    AddClosed(command, options.settings)
        ->description("With --cuts: which end of an interval belongs to it; right if "
                      "not given");
    AddTempDirectory(command, options.tempDirectory);
    AddOutput(command, options.output);
    AddQuiet(command, options.output.isQuiet);
    command.footer(kEvaluateExamples);
    command.callback(
        [&request, files]
        {
            request.command = Request::Command::kEvaluate;
            SettleEvaluation(request.evaluate, *files);
        });
}

void AddApply(CLI::App& app, Request& request)
{
    ApplyOptions& options = request.apply;
    CLI::App& command = *app.add_subcommand("apply", "Add the bins of each attribute to a file as new columns");
    AddBins(command, options.bins);
    AddTable(command, options.table);
    AddMissing(command, options.missingText, options.isBadMissing);
    options.output = "-";
    command.add_option("-o,--output", options.output, "The file to write; standard output if not given")
        ->check(MakeNameCheck())
        ->option_text("FILE")
        ->group("Output");
    AddEncoding(command, options.encoding, "");
    command.add_flag("--in-place-columns", options.isInPlace, "Write the bins in place of the values")->group("Output");
    AddQuiet(command, options.isQuiet);
    command.footer(kApplyExamples);
    command.callback([&request] { request.command = Request::Command::kApply; });
}

/// The version of the tool, which is the library's.
std::string GetVersion()
{
    BINSettings settings;
    BINVarList list;
    list.AddContVar("x", "", IBINVariable::RoleAttribute);
    const std::unique_ptr<IBINAlgorithm> algorithm(BINFactory().CreateBINAlgorithm(settings, list));
    return "mcbin " MCBIN_VERSION " with " + (algorithm ? algorithm->GetVersionString() : "");
}

/// The options of a command by group; those without one are hidden.
std::vector<OptionGroup> DescribeOptions(const CLI::App& command)
{
    std::vector<OptionGroup> groups;
    for (const std::string& title : command.get_groups())
    {
        OptionGroup group{title, {}};
        for (const CLI::Option* const option : command.get_options())
        {
            if (option->get_group() == title)
            {
                group.options.push_back(
                    {option->get_name(false, true), option->get_option_text(), option->get_description()});
            }
        }
        if (!title.empty() && !group.options.empty())
            groups.push_back(group);
    }
    return groups;
}

ToolHelp DescribeTool(const CLI::App& app)
{
    ToolHelp tool{app.get_name(), app.get_description(), {}, app.get_footer()};
    for (const CLI::App* const command : app.get_subcommands([](const CLI::App*) { return true; }))
    {
        CommandHelp help{
            command->get_name(), command->get_description(), {}, DescribeOptions(*command), command->get_footer()};
        for (const CLI::Option* const option : command->get_options())
        {
            if (option->get_positional())
                help.positionals.push_back(option->get_name(true));
        }
        tool.commands.push_back(help);
    }
    return tool;
}

std::unique_ptr<CLI::App> MakeApp(Request& request)
{
    auto app =
        std::make_unique<CLI::App>("Finds bins in the columns of a text file, shows them, and applies them.", "mcbin");
    app->require_subcommand(0, 1);
    app->set_version_flag("--version", GetVersion);
    app->add_flag_callback(
           "--man",
           [&request, tool = app.get()]
           {
               request.command = Request::Command::kText;
               request.text = MakeManPage(DescribeTool(*tool));
           },
           "Print this as a manual page, for man")
        ->group("");
    app->footer(std::string("'mcbin COMMAND --help' tells of the options of a command.\n\n") + kExitCodes);
    AddSupervised(*app, request);
    AddEqualFrequency(*app, request);
    AddShow(*app, request);
    AddEvaluate(*app, request);
    AddApply(*app, request);
    app->final_callback(
        [&request]
        {
            if (request.command == Request::Command::kNone)
                throw CLI::RequiredError("A command");
        });
    return app;
}

/// The first argument is an option or the name of a command. Without this check it would be told to be one too many.
void ThrowUnlessCommand(const CLI::App& app, int argc, const char* const* argv)
{
    const std::string word = argc > 1 ? argv[1] : "-";
    if (!word.empty() && word.front() == '-')
        return;
    std::vector<std::string> names;
    for (const CLI::App* const command : app.get_subcommands([](const CLI::App*) { return true; }))
        names.push_back(command->get_name());
    if (std::find(names.begin(), names.end(), word) != names.end())
        return;
    const std::optional<std::string> near = FindNear(word, names);
    throw UsageError("no such command: " + Quote(word) + "; " +
                     (near ? "did you mean '" + *near + "'?" : "there are " + Join(names, ", ")));
}

} // namespace

Request ParseCommandLine(int argc, const char* const* argv)
{
    Request request;
    const std::unique_ptr<CLI::App> app = MakeApp(request);
    ThrowUnlessCommand(*app, argc, argv);
    try
    {
        app->parse(argc, argv);
    }
    catch (const CLI::Success& help)
    {
        std::ostringstream text;
        app->exit(help, text, text);
        request.command = Request::Command::kText;
        request.text = text.str();
    }
    catch (const CLI::ParseError& error)
    {
        throw UsageError(error.what());
    }
    return request;
}
