#ifndef MCBIN_STATUSWORDS_H
#define MCBIN_STATUSWORDS_H

#include <string>

namespace MCBinning
{
class MCStatus;
}

/// The status for a person, such as "warning 120015: no record has a valid value". "OK" if it is that.
std::string DescribeStatus(const MCBinning::MCStatus& status);

#endif
