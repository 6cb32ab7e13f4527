#ifndef MCBIN_BINTABLE_H
#define MCBIN_BINTABLE_H

#include "hosts/mcbin/output/tableoutput.h"

#include <iosfwd>

struct AttributeBins;

/// Prints a row for each bin: the bin, its weight and share, the weights of the target's categories, for a target of
/// two of them the rates, and a bar. On a narrow screen the less important columns are left out, so that no row is
/// broken unless the bin, its weight and its share are too wide by themselves.
void PrintBinTable(std::ostream& os, const AttributeBins& bins, const Screen& screen);

#endif
