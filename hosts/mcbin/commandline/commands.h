#ifndef MCBIN_COMMANDS_H
#define MCBIN_COMMANDS_H

#include "hosts/mcbin/commandline/commandline.h"

#include <CLI/CLI.hpp>

// The commands of the tool. What the user asks for goes into the request.

void AddSupervised(CLI::App& app, Request& request);
void AddEqualFrequency(CLI::App& app, Request& request);
void AddShow(CLI::App& app, Request& request);
void AddEvaluate(CLI::App& app, Request& request);
void AddApply(CLI::App& app, Request& request);

#endif
