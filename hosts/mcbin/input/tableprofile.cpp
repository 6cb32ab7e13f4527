#include "hosts/mcbin/input/tableprofile.h"

#include "bins/categoryorder.h"
#include "bins/numbers.h"
#include "bins/utf8.h"
#include "hosts/mcbin/input/columnfaults.h"
#include "hosts/mcbin/input/columnplan.h"
#include "hosts/mcbin/input/tablereader.h"
#include "hosts/mcbin/progress.h"
#include "hosts/mcbin/text.h"

#include <fmt/format.h>

#include <algorithm>
#include <cmath>
#include <string>
#include <string_view>

namespace
{

void NoteText(Column& column, std::string_view field, long line)
{
    if (column.numTexts++ == 0)
    {
        column.firstText = field;
        column.firstTextLine = line;
    }
    if (!FindOrnaments(field).empty() && column.numOrnamented++ == 0)
        column.firstOrnamented = field;
}

/// A column of a kind that isn't known yet may turn out to hold categories.
void LearnCategory(Column& column, std::string_view field)
{
    if (column.categories.size() > kMostCategories || column.categories.find(field) != column.categories.end())
        return;
    if (IsText(field))
        column.categories.emplace(field);
    else
        column.isBinary = true;
}

void ProfileNumber(Column& column, const NumberForm& numbers, std::string_view field, long line, Care care)
{
    constexpr long kManyNumbers = 1000;
    if (column.kind == ColumnKind::kUnknown)
        LearnCategory(column, field);
    if (!std::isnan(numbers.Parse(field)))
    {
        ++column.numNumbers;
        column.isBelieved = care == Care::kHasty && column.numTexts == 0 && column.numNumbers >= kManyNumbers;
        return;
    }
    NoteText(column, field, line);
}

/// A weight is looked at in every row: on all of them together depends what the library is given for each.
void ProfileWeight(const TableReader& table, ColumnPlan& plan, std::size_t position, std::string_view field, long line)
{
    Column& column = plan.columns[position];
    const double weight = plan.numbers.Parse(field);
    if (ColumnPlan::IsWeight(column, weight))
    {
        plan.weights.Add(weight);
        return;
    }
    ++plan.numWithoutWeight;
    if (std::isnan(weight))
        NoteText(column, field, line);
    if (plan.isBadMissing || std::isnan(weight) || column.IsMissing(weight))
        return;
    throw table.MakeNotAWeight(line, position, field, weight);
}

void ProfileCategory(const TableReader& table, Column& column, std::size_t position, std::string_view field, long line)
{
    if (column.categories.find(field) != column.categories.end() || column.categories.size() > kMostCategories)
        return;
    if (!IsText(field))
    {
        throw table.MakeFailure(line, position,
                                Quote(Shorten(field)) +
                                    " is not UTF-8 text; convert the file first, for instance with iconv");
    }
    column.categories.emplace(field);
    if (column.categories.size() <= kMostCategories)
        return;
    // Nothing can be done without the target. Of the others all are to be told together.
    if (column.isTarget)
    {
        throw table.MakeFailure(line, position,
                                fmt::format("more than {} categories, which are too many for a target; how a column of "
                                            "numbers becomes one is told by 'mcbin supervised --help'",
                                            kMostCategories));
    }
    column.firstText = field;
    column.firstTextLine = line;
}

void ProfileField(const TableReader& table, ColumnPlan& plan, std::size_t position, std::string_view field, long line,
                  Care care)
{
    Column& column = plan.columns[position];
    if (column.isBelieved || !column.IsUsed())
        return;
    if (plan.IsMissing(column, field))
    {
        plan.numWithoutWeight += column.isWeight ? 1 : 0;
        return;
    }
    if (column.isWeight)
        ProfileWeight(table, plan, position, field, line);
    else if (column.kind == ColumnKind::kCategorical)
        ProfileCategory(table, column, position, field, line);
    else
        ProfileNumber(column, plan.numbers, field, line, care);
}

/// Why a column of text is no attribute; empty if it is one, as one that was asked for by its name is.
std::string FindReason(const Column& column, const ColumnPlan& plan)
{
    if (column.IsOrnamented() || (!plan.areTextsBinned && !column.isNamed))
        return "text";
    if (column.isBinary)
        return "text that is not UTF-8";
    if (column.isNamed)
        return "";
    if (column.missingInterval)
        return "text, for which an interval of missing values is declared";
    return DescribeUnusable({column.categories.begin(), column.categories.end()}, column.numNumbers + column.numTexts);
}

/// Of a column that has no fault.
void SettleKind(Column& column, const ColumnPlan& plan)
{
    if (column.IsText())
    {
        column.reasonLeftOut = FindReason(column, plan);
        column.isAttribute = column.reasonLeftOut.empty();
        column.kind = column.isAttribute ? ColumnKind::kCategorical : ColumnKind::kUnknown;
    }
    else if (column.kind == ColumnKind::kUnknown)
    {
        column.kind = ColumnKind::kContinuous;
        column.categories.clear();
    }
}

} // namespace

void ProfileTable(TableReader& table, ColumnPlan& plan, Progress& progress, Care care)
{
    progress.BeginRows("learning the columns");
    while (const CsvRow* const row = table.NextRow())
    {
        progress.CountRow();
        ++plan.numRows;
        for (std::size_t i = 0; i < row->Size(); ++i) ProfileField(table, plan, i, (*row)[i], row->GetLine(), care);
    }
    if (plan.numRows == 0)
        throw table.MakeFailure("there is no row below the header");
    ThrowIfFaulty(table, plan);
    for (Column& column : plan.columns)
    {
        if (column.IsUsed())
            SettleKind(column, plan);
    }
}

void ScaleWeights(TableReader& table, ColumnPlan& plan, Progress& progress)
{
    const auto isWeight = [](const Column& column) { return column.isWeight; };
    const auto column = std::find_if(plan.columns.begin(), plan.columns.end(), isWeight);
    if (!plan.isWeightScaled || column == plan.columns.end())
        return;
    const auto position = static_cast<std::size_t>(column - plan.columns.begin());
    WeightGrid grid(plan.weights);
    double total = 0.0;
    table.Rewind();
    progress.BeginRows("summing the weights");
    while (const CsvRow* const row = table.NextRow())
    {
        progress.CountRow();
        const std::string_view field = (*row)[position];
        const double weight = plan.IsMissing(*column, field) ? 0.0 : plan.numbers.Parse(field);
        if (ColumnPlan::IsWeight(*column, weight))
            total += grid.Round(weight);
    }
    plan.weights.ScaleToRecords(total);
}
