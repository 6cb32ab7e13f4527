#include "hosts/mcbin/commandline/commands.h"

#include "hosts/mcbin/commandline/sharedoptions.h"
#include "hosts/mcbin/helptexts.h"

#include <limits>
#include <memory>
#include <string>
#include <vector>

namespace
{

/// A supervised run refuses to work without a number of bins, but uses it for pre-binning alone, which is off as long
/// as no distinct value threshold is set. With 1000 bins pre-binning costs hardly any precision: a border is off by a
/// thousandth of the weight at most.
constexpr int kPreBins = 1000;

void AddBins(CLI::App& command, std::string& bins)
{
    command.add_option("BINS", bins, "The bins, as --format json has written them")
        ->required()
        ->option_text("BINS.json");
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

} // namespace

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

void AddShow(CLI::App& app, Request& request)
{
    CLI::App& command = *app.add_subcommand("show", "Show bins that were found before, in another form");
    AddBins(command, request.show.bins);
    AddOutput(command, request.show.output);
    command.footer(kShowExamples);
    command.callback([&request] { request.command = Request::Command::kShow; });
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
