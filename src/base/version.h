#ifndef MCOBNQRT_VERSION_H
#define MCOBNQRT_VERSION_H

#include <string>

/// The name of the component and the version of the library; the same for both kinds of algorithm.
std::string GetComponentVersion();

#endif
