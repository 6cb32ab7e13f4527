#include "hosts/mcbin/binner.h"

#include "bins/numbers.h"
#include "hosts/mcbin/figures.h"
#include "hosts/mcbin/findings.h"

#include <algorithm>

Binner::Binner(const Findings& findings, const Result& result, const std::vector<std::string>& missingText)
    : fVariable(&findings.GetAttribute(result)), fResult(&result), fIsRightClosed(findings.settings.isRightClosed),
      fMissingTexts(findings.missingText)
{
    fMissingTexts.insert(fMissingTexts.end(), missingText.begin(), missingText.end());
    fMissingTexts.insert(fMissingTexts.end(), fVariable->missingTexts.begin(), fVariable->missingTexts.end());
    fMissingNumbers = fVariable->missingNumbers;
    for (const std::string& text : fMissingTexts)
        if (const std::optional<double> number = ParseNumber(text))
            fMissingNumbers.push_back(*number);
    for (std::size_t code = 0; code < fVariable->categories.size(); ++code)
        fBins.emplace(fVariable->categories[code],
                      FindBin(result.cutPoints, fIsRightClosed, static_cast<double>(code)));
}

Binner::Place Binner::Find(std::string_view field)
{
    if (field.empty() || std::find(fMissingTexts.begin(), fMissingTexts.end(), field) != fMissingTexts.end())
        return {};
    if (fVariable->kind == VariableKind::kStringCategorical)
        return FindCategory(field);
    const std::optional<double> value = ParseNumber(field);
    if (!value)
        return {std::nullopt, true};
    if (IsMissing(*value))
        return {};
    if (fVariable->kind == VariableKind::kNumericCategorical)
        return FindCategory(FormatNumber(*value)); // "1.0" is the category 1
    return {FindBin(fResult->cutPoints, fIsRightClosed, *value), false};
}

bool Binner::IsCategorical() const
{
    return fVariable->IsCategorical();
}

bool Binner::IsMissing(double value) const
{
    const auto& interval = fVariable->missingInterval;
    return std::find(fMissingNumbers.begin(), fMissingNumbers.end(), value) != fMissingNumbers.end() ||
           (interval && value >= interval->first && value <= interval->second);
}

Binner::Place Binner::FindCategory(std::string_view field)
{
    fKey = field;
    const auto found = fBins.find(fKey);
    if (found == fBins.end())
        return {std::nullopt, true};
    return {found->second, false};
}
