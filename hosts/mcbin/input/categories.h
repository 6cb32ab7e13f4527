#ifndef MCBIN_CATEGORIES_H
#define MCBIN_CATEGORIES_H

#include <optional>
#include <string>
#include <string_view>
#include <unordered_map>
#include <vector>

class NumberForm;
struct Column;

/// The categories of a column, and which of them each of its fields is.
///
/// If all fields are numbers the categories are numbers in ascending order, and fields such as "1" and "1.0" are one
/// category; not if there is a field such as "007", which is an identifier. Otherwise they are texts in the order of
/// their bytes, or in the one that the column has. So the order of the rows makes no difference.
class Categories
{
public:
    /// The column's fields have all been read. \throw Failure if the order of the column lacks a field.
    /// `numbers` is how numbers are written.
    Categories(const Column& column, const NumberForm& numbers);

    bool AreNumbers() const { return fAreNumbers; }

    /// By code; numbers as FormatNumber writes them.
    const std::vector<std::string>& GetNames() const { return fNames; }

    /// The code of a field; gMissingValue if it is a number that is declared missing, and nothing if it is not among
    /// the column's.
    std::optional<double> FindCode(std::string_view field);

private:
    void AddNumbers(const Column& column, const NumberForm& numbers);
    void AddTexts(const Column& column);
    void AddOrdered(const Column& column);

    bool fAreNumbers = false;
    std::vector<std::string> fNames;
    std::unordered_map<std::string, double> fCodes; ///< by field
    std::string fKey;                               ///< kept for its memory
};

#endif
