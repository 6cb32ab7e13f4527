#ifndef MCBIN_JSONOUTPUT_H
#define MCBIN_JSONOUTPUT_H

#include <iosfwd>

struct Findings;

/// The name and version of the form, which docs/json.md describes.
inline constexpr const char* kSchema = "mcobnqrt-bins";
inline constexpr int kSchemaVersion = 2;

void PrintJson(std::ostream& os, const Findings& findings);

#endif
