#include "base/version.h"

std::string GetComponentVersion()
{
    return "Supervised Binning Component Ver. 1.0 (MCOBNQRT " MCOBNQRT_VERSION ")";
}
