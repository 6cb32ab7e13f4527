#ifndef MCBIN_COMMANDLINE_H
#define MCBIN_COMMANDLINE_H

#include "hosts/mcbin/options.h"

#include <CLI/CLI.hpp>

#include <memory>

/// What the command line asks for. One of the commands is set.
struct Request
{
    enum class Command
    {
        kNone,
        kSupervised,
        kEqualFrequency,
        kApply
    };

    Command command = Command::kNone;
    BinOptions bin;
    ApplyOptions apply;
    bool isManPage = false;
};

/// The options, commands and help texts of the tool; parsing fills `request`, which must outlive the result.
std::unique_ptr<CLI::App> MakeCommandLine(Request& request);

/// \throw CLI::ParseError if the first argument is neither an option nor the name of a command. It tells which command may
/// be meant, or else which there are.
void ThrowUnlessCommand(const CLI::App& app, int argc, const char* const* argv);

#endif
