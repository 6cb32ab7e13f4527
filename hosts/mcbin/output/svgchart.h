#ifndef MCBIN_SVGCHART_H
#define MCBIN_SVGCHART_H

#include <iosfwd>

struct AttributeBins;

/// Prints the chart of an attribute as a key and an SVG element of a page: for each bin, side by side, the shares of
/// the target's categories as a stack, and below it the weight of the bin, with the weight of evidence as a line over it.
/// Without a target there are the weights alone. Every part tells its figures where the pointer rests on it.
void PrintChart(std::ostream& os, const AttributeBins& bins);

/// Prints a picture as small as a word: the rate from bin to bin, or of a target that has none the weight.
void PrintSpark(std::ostream& os, const AttributeBins& bins);

#endif
