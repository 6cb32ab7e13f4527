#ifndef MCBIN_COMMANDLINE_H
#define MCBIN_COMMANDLINE_H

#include "hosts/mcbin/options.h"

#include <stdexcept>
#include <string>

/// What the command line asks for.
struct Request
{
    enum class Command
    {
        kNone,
        kSupervised,
        kEqualFrequency,
        kShow,
        kEvaluate,
        kApply,
        kText ///< to print `text` and end
    };

    Command command = Command::kNone;
    BinOptions bin;           ///< of the first two commands
    ShowOptions show;         ///< of kShow
    EvaluateOptions evaluate; ///< of kEvaluate
    ApplyOptions apply;       ///< of kApply
    std::string text;         ///< the help, the version or the manual page
};

/// What is wrong with a command line, in words for the user.
class UsageError : public std::runtime_error
{
public:
    using std::runtime_error::runtime_error;
};

/// \throw UsageError
Request ParseCommandLine(int argc, const char* const* argv);

#endif
