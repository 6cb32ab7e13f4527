#ifndef MCBIN_BINNER_H
#define MCBIN_BINNER_H

#include <cstddef>
#include <optional>
#include <string>
#include <string_view>
#include <unordered_map>
#include <vector>

struct Findings;
struct Result;
struct Variable;

/// Puts the values of one attribute, as they stand in a text file, into its bins.
class Binner
{
public:
    struct Place
    {
        std::optional<std::size_t> bin; ///< from 0; nothing if the value is missing or bad
        bool isBad = false;             ///< no number where one should be, or a category never seen
    };

    /// `missingText` counts as missing beside what the findings declare; a number in it stands for all ways to write the
    /// number, where the attribute has numbers. The findings must outlive the object.
    Binner(const Findings& findings, const Result& result, const std::vector<std::string>& missingText);

    Place Find(std::string_view field);

    bool IsCategorical() const;

private:
    bool IsMissing(double value) const;
    Place FindCategory(std::string_view field);

    const Variable* fVariable;
    const Result* fResult;
    bool fIsRightClosed;
    std::vector<std::string> fMissingTexts;
    std::vector<double> fMissingNumbers;                ///< the variable's, and those among the texts
    std::unordered_map<std::string, std::size_t> fBins; ///< by category
    std::string fKey;                                   ///< kept for its memory
};

#endif
