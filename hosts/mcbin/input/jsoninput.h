#ifndef MCBIN_JSONINPUT_H
#define MCBIN_JSONINPUT_H

#include "bins/bins.h"
#include "bins/json.h"

#include <string>

/// Reads what ToJson(), or another program that keeps to docs/json.md, has written.
/// \throw Failure if the file can't be read, isn't JSON, or isn't of the form.
Bins ReadJson(const std::string& path, Edits edits = Edits::kRefused);

#endif
