#ifndef MCBIN_ROWTEXT_H
#define MCBIN_ROWTEXT_H

#include <cstddef>
#include <string>
#include <string_view>
#include <vector>

/// A row of a delimited text file as it stands there.
struct RowText
{
    std::string_view fields; ///< with the quotes and spaces around them, and the delimiters between them
    std::string_view end;    ///< LF, CRLF or CR; empty for a last row without a line end
};

/// Holds the text that a parser is given, and cuts it into its rows again.
///
/// In a row that is well formed every quote opens or closes a quoted part, as a doubled one does both. So it is known
/// without the parser where a row ends.
class RowCutter
{
public:
    /// Invalidates the rows that have been cut off.
    void Append(std::string_view text);

    /// Cuts off the text up to the next line end outside of quotes, or all of it if there is none. The text is good
    /// until the next call of Append().
    RowText Cut();

    void Clear();

private:
    std::string fText;
    std::size_t fBegin = 0; ///< of what hasn't been cut off
};

/// Puts the fields of the row, as they stand in it, into `fields`.
void SplitFields(std::string_view row, char delimiter, std::vector<std::string_view>& fields);

#endif
