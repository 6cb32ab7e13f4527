#ifndef MCOBNQRT_BINS_WORDS_H
#define MCOBNQRT_BINS_WORDS_H

#include <string>

namespace MCBinning
{
class MCStatus;
}

/// What the status says, without its code. "OK" if it is that.
const char* GetStatusWords(const MCBinning::MCStatus& status);

/// "ok", "warning" or "error".
const char* GetSeverity(const MCBinning::MCStatus& status);

/// The status for a person, such as "warning 120015: no record has a valid value". "OK" if it is that.
std::string DescribeStatus(const MCBinning::MCStatus& status);

#endif
