#ifndef MCBIN_MANPAGE_H
#define MCBIN_MANPAGE_H

#include <string>

struct ToolHelp;

/// The manual page, in the language of man.
std::string MakeManPage(const ToolHelp& tool);

#endif
