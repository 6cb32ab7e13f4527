#include "texttable.h"

#include <algorithm>
#include <cstddef>
#include <ostream>

namespace
{

std::size_t GetWidth(const std::string& text)
{
    const auto isFirstByte = [](char c) { return (static_cast<unsigned char>(c) & 0xC0) != 0x80; };
    return static_cast<std::size_t>(std::count_if(text.begin(), text.end(), isFirstByte));
}

std::vector<std::size_t> GetColumnWidths(const std::vector<std::vector<std::string>>& rows)
{
    std::vector<std::size_t> widths(rows.empty() ? 0 : rows.front().size());
    for (const std::vector<std::string>& row : rows)
        for (std::size_t i = 0; i < widths.size(); ++i) widths[i] = std::max(widths[i], GetWidth(row[i]));
    return widths;
}

} // namespace

std::string Printable(std::string_view text)
{
    constexpr char kDigits[] = "0123456789abcdef";
    std::string printable;
    for (const char c : text)
    {
        const auto byte = static_cast<unsigned char>(c);
        if (byte >= 0x20 && byte != 0x7F)
            printable += c;
        else
            printable += {'\\', 'x', kDigits[byte / 16], kDigits[byte % 16]};
    }
    return printable;
}

std::string Quote(std::string_view text)
{
    return "'" + Printable(text) + "'";
}

void PrintTextTable(std::ostream& os, const std::vector<std::vector<std::string>>& rows)
{
    const std::vector<std::size_t> widths = GetColumnWidths(rows);
    for (const std::vector<std::string>& row : rows)
    {
        for (std::size_t i = 0; i < row.size(); ++i)
        {
            const std::string padding(widths[i] - GetWidth(row[i]), ' ');
            os << "  " << (i == 0 ? row[i] + padding : padding + row[i]);
        }
        os << '\n';
    }
}
