#ifndef MCBIN_COMMANDS_H
#define MCBIN_COMMANDS_H

#include <iosfwd>
#include <string>

struct SupervisedOptions
{
    std::string file;
    std::string target; ///< the name of a column
};

struct EqualFrequencyOptions
{
    std::string file;
    int bins = 0; ///< at least 2
};

/// The commands of the tool: each reads a file, bins its numeric columns and prints what was found.
/// \throw Failure if that can't be done; perhaps nothing has been printed.
void RunSupervised(const SupervisedOptions& options, std::ostream& os);
void RunEqualFrequency(const EqualFrequencyOptions& options, std::ostream& os);

#endif
