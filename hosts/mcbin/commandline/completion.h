#ifndef MCBIN_COMPLETION_H
#define MCBIN_COMPLETION_H

#include <string>

struct ToolHelp;

// Scripts by which a shell completes commands, options, the words that an option can be followed by, and files.

/// For bash, to be sourced, or to lie where bash-completion finds it by the name of the tool.
std::string MakeBashCompletion(const ToolHelp& tool);

/// For zsh, to lie in a directory of $fpath as _ and the name of the tool.
std::string MakeZshCompletion(const ToolHelp& tool);

#endif
