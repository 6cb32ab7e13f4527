#include "bins/binner.h"

#include "bins/lookup.h"
#include "bins/numbers.h"

#include <algorithm>
#include <cmath>

Binner::Binner(const AttributeBins& bins, const std::vector<std::string>& missingTexts, const NumberForm& numbers)
    : fBins(bins), fNumbers(numbers), fMissingTexts(missingTexts)
{
    const Variable& variable = *bins.attribute;
    fMissingTexts.insert(fMissingTexts.end(), variable.missingTexts.begin(), variable.missingTexts.end());
    fMissingNumbers = variable.missingNumbers;
    for (const std::string& text : fMissingTexts)
    {
        if (const std::optional<double> number = ParseNumber(text))
            fMissingNumbers.push_back(*number);
    }
    for (std::size_t code = 0; code < variable.categories.size(); ++code)
    {
        const auto value = static_cast<double>(code);
        fFoundByCategory.emplace(variable.categories[code],
                                 Found{FindBin(bins.cutPoints, bins.isRightClosed, value), false, value});
    }
    if (variable.rare)
        fUnseen = fFoundByCategory.at(variable.categories.at(variable.rare->code));
}

Binner::Found Binner::Find(std::string_view field)
{
    if (field.empty() || std::find(fMissingTexts.begin(), fMissingTexts.end(), field) != fMissingTexts.end())
        return {};
    if (fBins.attribute->kind == VariableKind::kStringCategorical)
        return FindCategory(field);
    const double value = fNumbers.Parse(field);
    if (std::isnan(value))
        return {std::nullopt, true, 0.0};
    if (IsMissing(value))
        return {};
    if (fBins.attribute->kind == VariableKind::kNumericCategorical)
        return FindCategory(FormatCategoryNumber(value)); // "1.0" is the category 1
    return {FindBin(fBins.cutPoints, fBins.isRightClosed, value), false, value};
}

bool Binner::IsMissing(double value) const
{
    const auto& interval = fBins.attribute->missingInterval;
    return std::find(fMissingNumbers.begin(), fMissingNumbers.end(), value) != fMissingNumbers.end() ||
           (interval && value >= interval->first && value <= interval->second);
}

Binner::Found Binner::FindCategory(std::string_view field)
{
    fKey = field;
    const auto found = fFoundByCategory.find(fKey);
    return found == fFoundByCategory.end() ? fUnseen : found->second;
}
