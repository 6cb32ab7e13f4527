#include "hosts/mcbin/input/rowtext.h"

namespace
{

/// The position of the first character outside of quotes that `isWanted` is true for, from `begin` on; the size of the
/// text if there is none.
template<class Predicate>
std::size_t FindOutsideOfQuotes(std::string_view text, std::size_t begin, Predicate isWanted)
{
    bool isQuoted = false;
    for (std::size_t i = begin; i < text.size(); ++i)
    {
        if (text[i] == '"')
            isQuoted = !isQuoted;
        else if (!isQuoted && isWanted(text[i]))
            return i;
    }
    return text.size();
}

} // namespace

void RowCutter::Append(std::string_view text)
{
    fText.erase(0, fBegin);
    fBegin = 0;
    fText += text;
}

RowText RowCutter::Cut()
{
    const std::string_view text = fText;
    const std::size_t begin = fBegin;
    const std::size_t end = FindOutsideOfQuotes(text, begin, [](char c) { return c == '\n' || c == '\r'; });
    const std::size_t endSize = end == text.size() ? 0 : text.substr(end, 2) == "\r\n" ? 2 : 1;
    fBegin = end + endSize;
    return {text.substr(begin, end - begin), text.substr(end, endSize)};
}

void RowCutter::Clear()
{
    fText.clear();
    fBegin = 0;
}

void SplitFields(std::string_view row, char delimiter, std::vector<std::string_view>& fields)
{
    fields.clear();
    for (std::size_t begin = 0;;)
    {
        const std::size_t end = FindOutsideOfQuotes(row, begin, [delimiter](char c) { return c == delimiter; });
        fields.push_back(row.substr(begin, end - begin));
        if (end == row.size())
            return;
        begin = end + 1;
    }
}
