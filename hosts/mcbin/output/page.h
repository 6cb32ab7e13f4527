#ifndef MCBIN_PAGE_H
#define MCBIN_PAGE_H

#include "bins/bins.h"

#include <iosfwd>
#include <string>

// What all pages have in common.

/// Everything up to the heading of the page, whose title is HTML.
void BeginPage(std::ostream& os, const std::string& title);
void EndPage(std::ostream& os);

/// What a heading calls the attribute, as HTML.
std::string MakeHtmlHeading(const AttributeBins& bins);

/// The name of the data without its directories, as HTML.
std::string MakeDataTitle(const Bins& bins);

#endif
