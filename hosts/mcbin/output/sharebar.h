#ifndef MCBIN_SHAREBAR_H
#define MCBIN_SHAREBAR_H

#include <cstddef>
#include <string>
#include <vector>

struct Bin;
struct AttributeBins;

/// Draws the shares of the target's categories in a bin as one bar of block characters. The heaviest categories have a
/// shade each, or a colour; all others share the last one. Without a target it draws the bin's share of the heaviest
/// bin.
class ShareBar
{
public:
    /// A `width` of 0 is for no bar at all. `bins` must outlive the object.
    ShareBar(const AttributeBins& bins, std::size_t width, bool hasColours);

    /// The bar with two spaces in front, or nothing if there is to be none.
    std::string Draw(const Bin& bin) const;

    /// The line that tells which shade is which; empty without a target.
    std::string GetLegend() const;

private:
    std::vector<double> GetParts(const Bin& bin) const;
    std::string Mark(std::size_t part, std::size_t length) const;

    const AttributeBins& fBins;
    std::size_t fWidth;
    bool fHasColours;
    std::vector<std::size_t> fCodes; ///< the categories with a shade of their own, in the order of their codes
    bool fHasOthers = false;
};

#endif
