#include "hosts/mcbin/output/columns.h"

#include "bins/utf8.h"
#include "hosts/mcbin/text.h"

#include <algorithm>

std::vector<std::size_t> GetWidths(const Rows& rows)
{
    std::vector<std::size_t> widths(rows.front().size());
    for (const std::vector<std::string>& row : rows)
    {
        for (std::size_t i = 0; i < row.size(); ++i) widths[i] = std::max(widths[i], GetWidth(row[i]));
    }
    return widths;
}

std::string Align(const std::vector<std::string>& row, const std::vector<std::size_t>& widths)
{
    std::string line = "  " + PadRight(row.front(), widths.front());
    for (std::size_t i = 1; i < row.size(); ++i) line += "  " + PadLeft(row[i], widths[i]);
    line.erase(line.find_last_not_of(' ') + 1);
    return line;
}
