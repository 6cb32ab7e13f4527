#include "hosts/mcbin/apply.h"
#include "hosts/mcbin/commandline.h"
#include "hosts/mcbin/failure.h"
#include "hosts/mcbin/figures.h"
#include "hosts/mcbin/input/tablereader.h"
#include "hosts/mcbin/interrupt.h"
#include "hosts/mcbin/manpage.h"
#include "hosts/mcbin/output/csvoutput.h"
#include "hosts/mcbin/output/htmlreport.h"
#include "hosts/mcbin/output/jsonoutput.h"
#include "hosts/mcbin/output/outputfile.h"
#include "hosts/mcbin/output/sqloutput.h"
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

#include <unistd.h>

namespace
{

constexpr int kFailure = 1;
constexpr int kUsage = 2;
constexpr int kFlagged = 3;
constexpr int kInterrupted = 130;

std::string Print(const Findings& findings, Format format)
{
    std::ostringstream os;
    switch (format)
    {
    case Format::kTable:
        PrintTables(os, findings, {GetTerminalWidth(STDOUT_FILENO), HasColours(STDOUT_FILENO)});
        break;
    case Format::kJson:
        PrintJson(os, findings);
        break;
    case Format::kCsv:
        PrintCsv(os, findings);
        break;
    case Format::kSql:
        PrintSql(os, findings);
        break;
    }
    return os.str();
}

/// All that is said on standard error, in one line each, goes through here: it quotes names and texts of the data.
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
/// \return what has gone wrong, for later: a full disk is no reason to lose the tables.
std::exception_ptr WriteReport(OutputFile& report, const Findings& findings)
{
    try
    {
        ThrowIfInterrupted();
        std::ostringstream page;
        PrintHtml(page, findings);
        report.Write(page.str());
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

/// Behind a signal nothing is a success, even if the last record had been read.
int GetExitCode(const Findings& findings, bool isStrict)
{
    if (IsInterrupted())
    {
        Tell("interrupted; these are the results up to then");
        return kInterrupted;
    }
    const auto isFlagged = [](const Result& result) { return !result.status.IsOK(); };
    return isStrict && std::any_of(findings.results.begin(), findings.results.end(), isFlagged) ? kFlagged : 0;
}

int Bin(const BinOptions& options)
{
    Progress progress(IsTerminal(STDERR_FILENO) && !options.output.isQuiet);
    TableOptions tableOptions = options.table;
    tableOptions.isReadTwice = true;
    tableOptions.spoolDirectory = options.settings.tempDirectory;
    TableReader table(tableOptions);
    // A name that can't be written is found out before the work.
    std::optional<OutputFile> report;
    if (!options.output.report.empty())
        report.emplace(options.output.report);
    const Findings findings = FindBins(table, options, progress);
    const std::exception_ptr failure = report ? WriteReport(*report, findings) : nullptr;
    WriteOut(Print(findings, options.output.format));
    for (const std::string& note : findings.notes) Tell(note);
    if (failure)
        std::rethrow_exception(failure);
    return GetExitCode(findings, options.output.isStrict);
}

int Run(int argc, char** argv)
{
    Request request;
    const std::unique_ptr<CLI::App> app = MakeCommandLine(request);
    try
    {
        ThrowUnlessCommand(*app, argc, argv);
        app->parse(argc, argv);
    }
    catch (const CLI::Success& help)
    {
        std::ostringstream text;
        app->exit(help, text, text);
        WriteOut(text.str());
        return 0;
    }
    catch (const CLI::ParseError& error)
    {
        Tell(error.what());
        std::cerr << "Run 'mcbin --help' for more information.\n";
        return kUsage;
    }
    if (request.isManPage)
    {
        std::ostringstream page;
        PrintManPage(page, *app);
        WriteOut(page.str());
        return 0;
    }
    if (request.command != Request::Command::kApply)
        return Bin(request.bin);
    Progress progress(IsTerminal(STDERR_FILENO) && !request.apply.isQuiet);
    ApplyBins(request.apply, progress);
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
