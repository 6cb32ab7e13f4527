#include "hosts/mcbin/output/svg.h"

#include "hosts/mcbin/text.h"

#include <fmt/format.h>

#include <ostream>

void PrintRectangle(std::ostream& os, const std::string& kind, double x, double y, double width, double height,
                    const std::string& title)
{
    os << fmt::format("<rect class=\"{}\" x=\"{:.2f}\" y=\"{:.2f}\" width=\"{:.2f}\" height=\"{:.2f}\"><title>{}"
                      "</title></rect>\n",
                      kind, x, y, width, height, EscapeHtml(title));
}

void PrintText(std::ostream& os, double x, double y, const char* anchor, const std::string& text)
{
    os << fmt::format("<text x=\"{:.2f}\" y=\"{:.2f}\" text-anchor=\"{}\">{}</text>\n", x, y, anchor, EscapeHtml(text));
}

void PrintAxis(std::ostream& os, double left, double right, double y)
{
    os << fmt::format("<line class=\"axis\" x1=\"{:.2f}\" y1=\"{:.2f}\" x2=\"{:.2f}\" y2=\"{:.2f}\"/>\n", left, y,
                      right, y);
}

void PrintCurve(std::ostream& os, const std::string& kind, const std::vector<Point>& points)
{
    os << "<polyline class=\"" << kind << "\" points=\"";
    for (const Point& point : points) os << fmt::format("{:.2f},{:.2f} ", point.x, point.y);
    os << "\"/>\n";
    for (const Point& point : points)
    {
        if (!point.title.empty())
        {
            os << fmt::format("<circle class=\"{}\" cx=\"{:.2f}\" cy=\"{:.2f}\" r=\"2.5\"><title>{}</title></circle>\n",
                              kind, point.x, point.y, EscapeHtml(point.title));
        }
    }
}
