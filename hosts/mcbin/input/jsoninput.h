#ifndef MCBIN_JSONINPUT_H
#define MCBIN_JSONINPUT_H

#include "hosts/mcbin/findings.h"

#include <string>

/// Reads what PrintJson(), or another program that keeps to docs/json.md, has written.
/// \throw Failure if the file can't be read, isn't JSON, or isn't of the form.
Findings ReadJson(const std::string& path);

#endif
