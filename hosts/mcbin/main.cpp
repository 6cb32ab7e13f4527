#include "apply.h"
#include "commandline.h"
#include "csvoutput.h"
#include "failure.h"
#include "figures.h"
#include "htmlreport.h"
#include "interrupt.h"
#include "jsonoutput.h"
#include "manpage.h"
#include "outputfile.h"
#include "progress.h"
#include "run.h"
#include "sqloutput.h"
#include "tableoutput.h"
#include "tablereader.h"
#include "terminal.h"

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

void WriteOut(const std::string& text)
{
    OutputFile output("-");
    output.Write(text);
    output.Commit();
}

int GetExitCode(const Findings& findings, bool isStrict)
{
    if (findings.status.GetErrorCode() == MCBinning::BINStatusCancelled)
    {
        std::cerr << "mcbin: interrupted; these are the results up to then\n";
        return kInterrupted;
    }
    const auto isFlagged = [](const Result& result) { return !result.status.IsOK(); };
    return isStrict && std::any_of(findings.results.begin(), findings.results.end(), isFlagged) ? kFlagged : 0;
}

void WriteReport(OutputFile& report, const Findings& findings)
{
    std::ostringstream page;
    PrintHtml(page, findings);
    report.Write(page.str());
    report.Commit();
}

int Bin(const BinOptions& options)
{
    Progress progress(IsTerminal(STDERR_FILENO) && !options.output.isQuiet);
    TableOptions tableOptions = options.table;
    tableOptions.isReadTwice = true;
    tableOptions.spoolDirectory = options.settings.tempDirectory;
    TableReader table(tableOptions);
    // A name that can't be written is found out before the work, and a full disk is no reason to lose the tables.
    std::optional<OutputFile> report;
    if (!options.output.report.empty())
        report.emplace(options.output.report);
    const Findings findings = FindBins(table, options, progress);
    std::exception_ptr failure;
    try
    {
        if (report)
            WriteReport(*report, findings);
    }
    catch (const Failure&)
    {
        failure = std::current_exception();
    }
    WriteOut(Print(findings, options.output.format));
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
        std::cerr << "mcbin: " << error.what() << "\nRun 'mcbin --help' for more information.\n";
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
        std::cerr << "mcbin: interrupted; there are no results yet\n";
        return kInterrupted;
    }
    catch (const PipeClosed&)
    {
        // Who closed it knows.
    }
    catch (const std::bad_alloc&)
    {
        std::cerr << "mcbin: out of memory\n";
    }
    catch (const std::exception& error)
    {
        std::cerr << "mcbin: " << error.what() << '\n';
    }
    return kFailure;
}
