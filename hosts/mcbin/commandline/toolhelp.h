#ifndef MCBIN_TOOLHELP_H
#define MCBIN_TOOLHELP_H

#include <string>
#include <vector>

// The texts of the help, without the parser that they are taken from.

struct OptionHelp
{
    std::string name;     ///< as in "--target", or several with commas between them
    std::string argument; ///< what it is followed by, with | between words to choose from; empty of a flag
    std::string description;
};

struct OptionGroup
{
    std::string title;
    std::vector<OptionHelp> options;
};

struct CommandHelp
{
    std::string name;
    std::string description;
    std::vector<std::string> positionals;
    std::vector<OptionGroup> groups;
    std::string footer; ///< parts, each "Title:" with lines below it, or text alone
};

struct ToolHelp
{
    std::string name;
    std::string description;
    std::vector<CommandHelp> commands;
    std::string footer;
};

#endif
