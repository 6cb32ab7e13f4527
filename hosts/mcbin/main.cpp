#include "bins/csv.h"
#include "bins/json.h"
#include "bins/labels.h"
#include "bins/sql.h"
#include "hosts/mcbin/apply.h"
#include "hosts/mcbin/commandline/commandline.h"
#include "hosts/mcbin/evaluate.h"
#include "hosts/mcbin/failure.h"
#include "hosts/mcbin/input/jsoninput.h"
#include "hosts/mcbin/input/tablereader.h"
#include "hosts/mcbin/interrupt.h"
#include "hosts/mcbin/output/evaluationpage.h"
#include "hosts/mcbin/output/evaluationtable.h"
#include "hosts/mcbin/output/htmlreport.h"
#include "hosts/mcbin/output/outputfile.h"
#include "hosts/mcbin/output/tableoutput.h"
#include "hosts/mcbin/progress.h"
#include "hosts/mcbin/run.h"
#include "hosts/mcbin/terminal.h"
#include "hosts/mcbin/text.h"

#include <algorithm>
#include <clocale>
#include <exception>
#include <iostream>
#include <new>
#include <optional>
#include <sstream>
#include <utility>

#include <unistd.h>

namespace
{

constexpr int kFailure = 1;
constexpr int kUsage = 2;
constexpr int kFlagged = 3;
constexpr int kInterrupted = 130;

/// The page of bins or of an evaluation.
template<class Shown>
std::string MakePage(const Shown& shown)
{
    std::ostringstream page;
    PrintHtml(page, shown);
    return page.str();
}

template<class Shown>
std::string MakeTables(const Shown& shown)
{
    std::ostringstream os;
    PrintTables(os, shown, {GetTerminalWidth(STDOUT_FILENO), HasColours(STDOUT_FILENO)});
    return os.str();
}

std::string Print(const Outcome& outcome, const OutputOptions& options)
{
    switch (options.format)
    {
    case Format::kTable:
        return MakeTables(outcome);
    case Format::kHtml:
        return MakePage(outcome);
    case Format::kJson:
        return ToJson(outcome.bins);
    case Format::kCsv:
        return ToCsv(outcome.bins);
    case Format::kSql:
        return ToSql(outcome.bins, options.sql);
    }
    return "";
}

std::string Print(const Evaluation& evaluation, const OutputOptions& options)
{
    switch (options.format)
    {
    case Format::kTable:
        return MakeTables(evaluation);
    case Format::kHtml:
        return MakePage(evaluation);
    case Format::kJson:
        return ToJson(evaluation);
    case Format::kCsv:
        return ToCsv(evaluation);
    case Format::kSql: // the command line has refused it
        break;
    }
    return "";
}

/// Prints a message on standard error, in one line. Messages quote names and texts of the data, so they are made
/// printable.
void Tell(const std::string& words)
{
    std::cerr << "mcbin: " << Printable(words) << '\n';
}

void WriteOut(const std::string& text)
{
    OutputFile output("-");
    output.Write(text);
    output.Commit();
}

/// Writes the page unless a signal has asked for the end: the page of a whole run is worth more than that of a part.
/// \return the failure, to be thrown once the tables are printed: a full disk is no reason to lose them.
template<class Shown>
std::exception_ptr WriteReport(OutputFile& report, const Shown& shown)
{
    try
    {
        ThrowIfInterrupted();
        report.Write(MakePage(shown));
        report.Commit();
    }
    catch (const Failure&)
    {
        return std::current_exception();
    }
    catch (const Interrupted&)
    {
        Tell("interrupted; the report is not written");
    }
    return nullptr;
}

/// After a signal the exit code tells of it, even if the last record had been read.
int GetExitCode(const Outcome& outcome, bool isStrict)
{
    if (IsInterrupted())
    {
        Tell("interrupted; these are the results up to then");
        return kInterrupted;
    }
    const auto isFlagged = [](const AttributeBins& result) { return !result.status.IsOK(); };
    return isStrict && std::any_of(outcome.bins.results.begin(), outcome.bins.results.end(), isFlagged) ? kFlagged : 0;
}

/// A name that can't be written is found out before the work.
std::optional<OutputFile> OpenFile(const std::string& name)
{
    return name.empty() ? std::nullopt : std::optional<OutputFile>(std::in_place, name);
}

/// Prints and writes what was asked for. \return the exit code.
int Present(Outcome outcome, const OutputOptions& options, std::optional<OutputFile>& report)
{
    outcome.areCategoriesShown = options.areCategoriesShown;
    const std::exception_ptr failure = report ? WriteReport(*report, outcome) : nullptr;
    WriteOut(Print(outcome, options));
    for (const std::string& note : outcome.notes) Tell(note);
    // JSON and the tables hold these attributes with their status.
    if (options.format == Format::kSql || options.format == Format::kCsv)
    {
        for (const std::string& unbinned : DescribeUnbinned(outcome.bins)) Tell(unbinned);
    }
    if (failure)
        std::rethrow_exception(failure);
    return GetExitCode(outcome, options.isStrict);
}

int Show(const ShowOptions& options)
{
    std::optional<OutputFile> report = OpenFile(options.output.report);
    return Present({ReadJson(options.bins), {}, {}}, options.output, report);
}

int Evaluate(const EvaluateOptions& options)
{
    Progress progress(IsTerminal(STDERR_FILENO) && !options.output.isQuiet);
    std::optional<OutputFile> report = OpenFile(options.output.report);
    std::optional<OutputFile> save = OpenFile(options.save);
    Evaluated evaluated = EvaluateBins(options, progress);
    if (save)
    {
        save->Write(ToJson(evaluated.evaluation.second));
        save->Commit();
    }
    if (options.bins.empty()) // there is nothing to compare with
        return Present({evaluated.evaluation.second, {}, evaluated.notes}, options.output, report);
    const std::exception_ptr failure = report ? WriteReport(*report, evaluated.evaluation) : nullptr;
    WriteOut(Print(evaluated.evaluation, options.output));
    for (const std::string& note : evaluated.notes) Tell(note);
    if (failure)
        std::rethrow_exception(failure);
    return options.output.isStrict && IsFlagged(evaluated.evaluation) ? kFlagged : 0;
}

int Bin(const BinOptions& options)
{
    Progress progress(IsTerminal(STDERR_FILENO) && !options.output.isQuiet);
    TableOptions tableOptions = options.table;
    tableOptions.isReadTwice = true;
    tableOptions.spoolDirectory = options.tempDirectory;
    TableReader table(tableOptions);
    std::optional<OutputFile> report = OpenFile(options.output.report);
    Outcome outcome = FindBins(table, options, progress);
    if (options.areCutsRounded && !IsInterrupted())
        outcome.bins = RoundCutPoints(table, std::move(outcome.bins), options, progress);
    return Present(std::move(outcome), options.output, report);
}

int Run(int argc, char** argv)
{
    Request request;
    try
    {
        request = ParseCommandLine(argc, argv);
    }
    catch (const UsageError& error)
    {
        Tell(error.what());
        std::cerr << "Run 'mcbin --help' for more information.\n";
        return kUsage;
    }
    if (request.command == Request::Command::kText)
    {
        WriteOut(request.text);
        return 0;
    }
    if (request.command == Request::Command::kShow)
        return Show(request.show);
    if (request.command == Request::Command::kEvaluate)
        return Evaluate(request.evaluate);
    if (request.command != Request::Command::kApply)
        return Bin(request.bin);
    Progress progress(IsTerminal(STDERR_FILENO) && !request.apply.isQuiet);
    for (const std::string& unbinned : ApplyBins(request.apply, progress)) Tell(unbinned);
    return 0;
}

} // namespace

int main(int argc, char** argv)
{
    // Text is UTF-8 whatever the user's locale is: for the width of characters, and for ? in a pattern.
    std::setlocale(LC_CTYPE, "C.UTF-8");
    CatchSignals();
    try
    {
        return Run(argc, argv);
    }
    catch (const Interrupted&)
    {
        Tell("interrupted; there are no results yet");
        return kInterrupted;
    }
    catch (const PipeClosed&)
    {
        // The reader closed the pipe; there is nobody to tell.
    }
    catch (const std::bad_alloc&)
    {
        Tell("out of memory");
    }
    catch (const std::exception& error)
    {
        Tell(error.what());
    }
    return kFailure;
}
