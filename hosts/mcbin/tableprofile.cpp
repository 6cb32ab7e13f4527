#include "tableprofile.h"

#include "columnplan.h"
#include "numbers.h"
#include "progress.h"
#include "tablereader.h"
#include "text.h"
#include "utf8.h"

#include <string_view>

namespace
{

/// A run takes the codes from 0 to 255.
constexpr std::size_t kMostCategories = 256;

void ProfileNumber(Column& column, std::string_view field, long line, Care care)
{
    constexpr long kManyNumbers = 1000;
    if (ParseNumber(field))
    {
        ++column.nNumbers;
        column.isBelieved = care == Care::kHasty && column.nTexts == 0 && column.nNumbers >= kManyNumbers;
        return;
    }
    if (column.nTexts++ == 0)
    {
        column.firstText = field;
        column.firstTextLine = line;
    }
}

void ProfileCategory(const TableReader& table, Column& column, std::size_t place, std::string_view field, long line)
{
    if (column.categories.find(field) != column.categories.end())
        return;
    if (!IsText(field))
        throw table.MakeFailure(
            line, place, Quote(Shorten(field)) + " is not UTF-8 text; convert the file first, for instance with iconv");
    column.categories.emplace(field);
    if (column.categories.size() > kMostCategories)
        throw table.MakeFailure(line, place,
                                "more than " + std::to_string(kMostCategories) +
                                    " categories, which are too many for a " +
                                    (column.isTarget ? "target" : "categorical attribute"));
}

void ProfileField(const TableReader& table, ColumnPlan& plan, std::size_t place, std::string_view field, long line,
                  Care care)
{
    Column& column = plan.columns[place];
    if (column.isBelieved || !column.IsUsed() || plan.IsMissing(column, field))
        return;
    if (column.kind == ColumnKind::kCategorical)
        ProfileCategory(table, column, place, field, line);
    else
        ProfileNumber(column, field, line, care);
}

void SettleKind(const TableReader& table, const ColumnPlan& plan, std::size_t place, Column& column)
{
    if (column.kind == ColumnKind::kCategorical)
        return;
    const bool isText = column.kind == ColumnKind::kUnknown && column.nTexts > 0 && column.nTexts >= column.nNumbers;
    if (isText && column.isNamed)
        throw table.MakeFailure(column.firstTextLine, place,
                                "holds text, such as " + Quote(Shorten(column.firstText)) +
                                    "; with --categorical its categories are binned in sorted order");
    if (isText)
        column.isAttribute = false;
    else if (column.nTexts > 0 && !plan.isBadMissing)
        throw table.MakeNotANumber(column.firstTextLine, place, column.firstText);
    else
        column.kind = ColumnKind::kContinuous;
}

} // namespace

void ProfileTable(TableReader& table, ColumnPlan& plan, Progress& progress, Care care)
{
    progress.BeginRows("learning the columns");
    while (const CsvRow* const row = table.NextRow())
    {
        progress.CountRow();
        ++plan.nRows;
        for (std::size_t i = 0; i < row->Size(); ++i) ProfileField(table, plan, i, (*row)[i], row->GetLine(), care);
    }
    if (plan.nRows == 0)
        throw table.MakeFailure("there is no row below the header");
    for (std::size_t i = 0; i < plan.columns.size(); ++i)
        if (plan.columns[i].IsUsed())
            SettleKind(table, plan, i, plan.columns[i]);
}
