#ifndef MCBIN_MANPAGE_H
#define MCBIN_MANPAGE_H

#include <iosfwd>

namespace CLI
{
class App;
}

/// Prints the help texts of the tool and of its commands as a manual page, in the language of man.
void PrintManPage(std::ostream& os, const CLI::App& app);

#endif
