#ifndef MCBINNING_BINSBINDING_H
#define MCBINNING_BINSBINDING_H

#include <nanobind/nanobind.h>

/// Defines the classes Variable, AttributeBins and Bins of the module, and what is said about a status.
void BindBins(nanobind::module_& module);

#endif
