#ifndef MCBIN_SVG_H
#define MCBIN_SVG_H

#include <iosfwd>
#include <string>
#include <utility>
#include <vector>

// Shapes of a picture in a page, in the picture's own units. Titles are shown where the pointer rests.

void PrintRectangle(std::ostream& os, const std::string& kind, double x, double y, double width, double height,
                    const std::string& title);

/// \param anchor "start", "middle" or "end": what of the text stands at `x`.
void PrintText(std::ostream& os, double x, double y, const char* anchor, const std::string& text);

void PrintAxis(std::ostream& os, double left, double right, double y);

/// A point of a line, with its title.
struct Point
{
    double x;
    double y;
    std::string title;
};

/// A line through the points, and a dot at each that has a title. \param kind the class of the line.
void PrintCurve(std::ostream& os, const std::string& kind, const std::vector<Point>& points);

#endif
