#include "hosts/mcbin/input/categories.h"

#include "bins/numbers.h"
#include "hosts/mcbin/failure.h"
#include "hosts/mcbin/input/columnplan.h"
#include "hosts/mcbin/text.h"

#include <mcobnqrt/mccommon.h>

#include <algorithm>
#include <cmath>
#include <map>

namespace
{

bool IsIdentifier(std::string_view field)
{
    return field.size() > 1 && field[0] == '0' && field[1] >= '0' && field[1] <= '9';
}

} // namespace

Categories::Categories(const Column& column, const NumberForm& numbers)
{
    const auto isNumber = [&](const std::string& field)
    { return !std::isnan(numbers.Parse(field)) && !IsIdentifier(field); };
    fAreNumbers = column.order.empty() && std::all_of(column.categories.begin(), column.categories.end(), isNumber);
    if (!column.order.empty())
        AddOrdered(column);
    else if (fAreNumbers)
        AddNumbers(column, numbers);
    else
        AddTexts(column);
}

std::optional<double> Categories::FindCode(std::string_view field)
{
    fKey = field;
    const auto found = fCodes.find(fKey);
    return found == fCodes.end() ? std::nullopt : std::optional(found->second);
}

void Categories::AddNumbers(const Column& column, const NumberForm& numbers)
{
    std::map<double, std::vector<std::string>> fieldsByNumber;
    for (const std::string& field : column.categories) fieldsByNumber[numbers.Parse(field)].push_back(field);
    for (const auto& [number, fields] : fieldsByNumber)
    {
        const bool isMissing = column.IsMissing(number);
        const double code = isMissing ? MCMV::gMissingValue : static_cast<double>(fNames.size());
        for (const std::string& field : fields) fCodes.emplace(field, code);
        if (!isMissing)
            fNames.push_back(FormatCategoryNumber(number));
    }
}

void Categories::AddTexts(const Column& column)
{
    for (const std::string& field : column.categories)
    {
        fCodes.emplace(field, static_cast<double>(fNames.size()));
        fNames.push_back(field);
    }
}

void Categories::AddOrdered(const Column& column)
{
    for (const std::string& name : column.order)
    {
        if (name == column.rareName)
        {
            for (const std::string& field : column.rare) fCodes.emplace(field, static_cast<double>(fNames.size()));
        }
        else
            fCodes.emplace(name, static_cast<double>(fNames.size()));
        fNames.push_back(name);
    }
    for (const std::string& field : column.categories)
    {
        if (fCodes.count(field) == 0)
        {
            throw Failure("the order of the categories of column " + Quote(column.name) + " lacks " +
                          Quote(Shorten(field)));
        }
    }
}
