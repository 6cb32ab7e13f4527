#ifndef MCBINNING_RUNS_H
#define MCBINNING_RUNS_H

#include "bins/bins.h"
#include "hosts/python/src/calls.h"
#include "hosts/python/src/field.h"
#include "hosts/python/src/libraryblocks.h"

#include <memory>
#include <optional>
#include <string>
#include <vector>

/// What is binned, beside the settings that the bins tell.
struct RunRequest
{
    std::vector<int> attributes; ///< indices of fields
    std::vector<int> targets;    ///< of a supervised run: that of each attribute
    std::optional<int> target;   ///< that of all attributes, if they have one
    std::string tempDir;         ///< empty for the system's
};

/// What is known of the fields, of which `target` is the index of the one that is the target of all attributes.
std::vector<std::shared_ptr<const Variable>> MakeVariables(const std::vector<Field>& fields, std::optional<int> target);

/// Bins the fields, which are the variables of `bins`, as `bins.settings` say, and adds to `bins` what was found. The
/// results of a run that was interrupted are not complete. Takes no GIL but for `progress`, which may be None, and
/// `interrupts`.
void BinFields(Bins& bins, const std::vector<Field>& fields, LibraryBlocks& blocks, const RunRequest& request,
               const nanobind::object& progress, Interrupts& interrupts);

#endif
