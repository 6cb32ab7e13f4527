#include "tableprofile.h"

#include "numbers.h"
#include "tablereader.h"
#include "texttable.h"

#include <string_view>

namespace
{

/// A run takes the codes from 0 to 255.
constexpr std::size_t kMostCategories = 256;

void AddCategory(Column& column, std::string_view field)
{
    if (column.categories.find(field) == column.categories.end())
        column.categories.emplace(field);
}

void NoteText(Column& column, std::string_view field, long line)
{
    column.isNumeric = false;
    column.firstText = field;
    column.firstTextLine = line;
}

void ProfileField(Column& column, std::string_view field, long line)
{
    if (field.empty())
        return;
    if (column.isTarget)
        AddCategory(column, field);
    else if (column.isNumeric && !ParseNumber(field))
        NoteText(column, field, line);
}

} // namespace

TableProfile ProfileTable(TableReader& table, std::optional<std::size_t> target)
{
    TableProfile profile;
    for (const std::string& name : table.GetColumnNames())
    {
        profile.columns.emplace_back();
        profile.columns.back().name = name;
    }
    if (target)
        profile.columns[*target].isTarget = true;

    while (const CsvRow* const row = table.NextRow())
    {
        ++profile.nRows;
        for (std::size_t i = 0; i < row->Size(); ++i) ProfileField(profile.columns[i], (*row)[i], row->GetLine());
        if (target && profile.columns[*target].categories.size() > kMostCategories)
            throw table.MakeFailure(*row, "column " + Quote(profile.columns[*target].name) + " has more than " +
                                              std::to_string(kMostCategories) +
                                              " categories, which are too many for a target");
    }
    if (profile.nRows == 0)
        throw table.MakeFailure("there is no row below the header");
    return profile;
}
