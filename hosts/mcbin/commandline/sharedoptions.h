#ifndef MCBIN_SHAREDOPTIONS_H
#define MCBIN_SHAREDOPTIONS_H

#include "hosts/mcbin/options.h"

#include <CLI/CLI.hpp>

#include <limits>
#include <string>
#include <vector>

// Options that several commands have, and checks of their values.

inline constexpr int kMost = std::numeric_limits<int>::max();

/// For names that have no meaning if they are empty, as from a variable of a shell that isn't set: they would seem not
/// to be given.
CLI::Validator MakeNameCheck();

/// CLI::Range lets a NaN pass.
/// Refuses what is no finite number from 0 to `most`, which `words` tell of.
CLI::Validator MakeNumberCheck(double most, const std::string& words);

/// A list that may be given by repeating the option; it doesn't swallow what follows.
CLI::Option* AddRepeated(CLI::App& command, const std::string& name, std::vector<std::string>& list,
                         const std::string& description, const std::string& what);

/// A list that may be given by repeating the option, or with commas. A list of names of columns is not for this: names
/// may hold commas, so these lists are split where the columns are known.
CLI::Option* AddList(CLI::App& command, const std::string& name, std::vector<std::string>& list,
                     const std::string& description, const std::string& what);

/// The name of one column.
CLI::Option* AddName(CLI::App& command, const std::string& option, std::string& name, const std::string& description);

void AddFormOfTable(CLI::App& command, TableOptions& table);

void AddTable(CLI::App& command, TableOptions& table);

void AddMissing(CLI::App& command, std::vector<std::string>& missingText, bool& isBadMissing);

void AddColumns(CLI::App& command, ColumnOptions& columns);

void AddNumBins(CLI::App& command, BinOptions& options, const std::string& description);

CLI::Option* AddClosed(CLI::App& command, Settings& settings);

void AddTempDirectory(CLI::App& command, std::string& tempDirectory);

void AddSettings(CLI::App& command, BinOptions& options);

/// A temporary directory that can't be used ends the tool as any other wrong use of it does.
void SettleTempDirectory(std::string& tempDirectory);

/// `when` tells in which form of output it counts.
void AddEncoding(CLI::App& command, Encoding& encoding, const std::string& when);

void AddOutput(CLI::App& command, OutputOptions& output);

void AddQuiet(CLI::App& command, bool& isQuiet);

/// An option that also goes by the name of an earlier release, which the help doesn't tell.
template<class Value>
CLI::Option* AddRenamed(CLI::App& command, const std::string& name, const std::string& earlierName, Value& value,
                        const std::string& description, const CLI::Validator& check)
{
    command.add_option(earlierName, value)->check(check)->group("");
    return command.add_option(name, value, description)->check(check);
}

#endif
