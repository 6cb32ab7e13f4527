#include "commands.h"
#include "failure.h"

#include <CLI/CLI.hpp>

#include <csignal>
#include <exception>
#include <iostream>
#include <limits>
#include <new>

namespace
{

constexpr int kFailure = 1;
constexpr int kUsage = 2;

void AddSupervised(CLI::App& app, SupervisedOptions& options)
{
    CLI::App* const command =
        app.add_subcommand("supervised", "Cut the numeric columns where the categories of a target are separated best");
    command->add_option("FILE", options.file, "CSV file; its first line names the columns")->required();
    command->add_option("--target", options.target, "The column whose categories are to be separated")
        ->required()
        ->option_text("NAME REQUIRED");
    command->callback([&options] { RunSupervised(options, std::cout); });
}

void AddEqualFrequency(CLI::App& app, EqualFrequencyOptions& options)
{
    CLI::App* const command =
        app.add_subcommand("equal-frequency", "Cut the numeric columns into bins of about equal weight");
    command->add_option("FILE", options.file, "CSV file; its first line names the columns")->required();
    command->add_option("--bins", options.bins, "The number of bins to aim at, at least 2")
        ->required()
        ->check(CLI::Range(2, std::numeric_limits<int>::max()))
        ->option_text("N REQUIRED");
    command->callback([&options] { RunEqualFrequency(options, std::cout); });
}

int Run(int argc, char** argv)
{
    CLI::App app("Bins the numeric columns of a CSV file.", "mcbin");
    app.require_subcommand(1);
    SupervisedOptions supervised;
    AddSupervised(app, supervised);
    EqualFrequencyOptions equalFrequency;
    AddEqualFrequency(app, equalFrequency);
    try
    {
        app.parse(argc, argv); // calls the command
    }
    catch (const CLI::Success& help)
    {
        app.exit(help);
    }
    catch (const CLI::ParseError& error)
    {
        std::cerr << "mcbin: " << error.what() << "\nRun 'mcbin --help' for more information.\n";
        return kUsage;
    }
    if (!std::cout.flush())
        throw Failure("cannot write the results to standard output");
    return 0;
}

} // namespace

int main(int argc, char** argv)
{
    // A closed pipe shall be a failed write, so that the temporary files are still removed.
    std::signal(SIGPIPE, SIG_IGN);
    try
    {
        return Run(argc, argv);
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
