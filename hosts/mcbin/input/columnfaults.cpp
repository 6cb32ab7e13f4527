#include "hosts/mcbin/input/columnfaults.h"

#include "bins/categoryorder.h"
#include "bins/numbers.h"
#include "hosts/mcbin/input/columnplan.h"
#include "hosts/mcbin/input/tablereader.h"
#include "hosts/mcbin/text.h"

#include <fmt/format.h>

#include <algorithm>
#include <string>
#include <vector>

namespace
{

enum class Fault
{
    kNone,
    kMixed,            ///< texts among numbers
    kText,             ///< text in a column that was asked for by name
    kTooManyCategories ///< of a categorical attribute
};

struct FaultyColumn
{
    std::size_t position; ///< in the table
    Fault fault;
};

Fault FindFault(const ColumnPlan& plan, const Column& column)
{
    const bool isCategorical =
        column.kind == ColumnKind::kCategorical || (column.IsText() && column.isNamed && !column.IsOrnamented());
    if (isCategorical && column.categories.size() > kMostCategories)
        return Fault::kTooManyCategories;
    if (!column.IsUsed() || column.kind == ColumnKind::kCategorical || column.numTexts == 0)
        return Fault::kNone;
    if (column.IsText())
        return column.isNamed && (column.IsOrnamented() || column.isBinary) ? Fault::kText : Fault::kNone;
    return plan.isBadMissing ? Fault::kNone : Fault::kMixed;
}

/// Advice to the user for a single column.
std::string AdviseOn(const Column& column, Fault fault)
{
    const bool isFree = column.isAttribute && column.kind == ColumnKind::kUnknown;
    if (fault == Fault::kMixed)
        return isFree ? "; --exclude leaves the column out, and --categorical bins its fields as categories" : "";
    return fault == Fault::kText ? "; with --categorical its fields are binned as categories"
                                 : "; --exclude leaves the column out";
}

Failure MakeFailure(const TableReader& table, const Column& column, const FaultyColumn& faulty)
{
    const long line = column.firstTextLine;
    const std::string advice = AdviseOn(column, faulty.fault);
    if (faulty.fault == Fault::kMixed)
        return Failure(table.MakeNotANumber(line, faulty.position, column.firstText).what() + advice);
    if (faulty.fault == Fault::kText)
    {
        return table.MakeFailure(line, faulty.position,
                                 "holds text, such as " + Quote(Shorten(column.firstText)) + advice);
    }
    return table.MakeFailure(
        line, faulty.position,
        fmt::format("more than {} categories, which are too many for a categorical attribute", kMostCategories) +
            advice);
}

std::string Describe(const Column& column, Fault fault)
{
    if (fault == Fault::kTooManyCategories)
        return fmt::format("{} has more than {} categories", Quote(column.name), kMostCategories);
    return fmt::format("{} {} ({} in line {})", Quote(column.name),
                       fault == Fault::kText ? "holds text" : "has not only numbers", Quote(Shorten(column.firstText)),
                       column.firstTextLine);
}

Failure MakeFailure(const TableReader& table, const ColumnPlan& plan, const std::vector<FaultyColumn>& faulty)
{
    const auto has = [&](Fault fault)
    { return std::any_of(faulty.begin(), faulty.end(), [=](const FaultyColumn& one) { return one.fault == fault; }); };
    std::vector<std::string> described;
    described.reserve(faulty.size());
    for (const FaultyColumn& one : faulty) described.push_back(Describe(plan.columns[one.position], one.fault));
    std::vector<std::string> advice{"--exclude leaves a column out"};
    if (has(Fault::kMixed) || has(Fault::kText))
        advice.emplace_back("--categorical bins its fields as categories");
    if (has(Fault::kMixed))
        advice.emplace_back("--bad missing takes what is no number as missing");
    const auto isOrnamented = [&](const FaultyColumn& one) { return plan.columns[one.position].IsOrnamented(); };
    if (std::any_of(faulty.begin(), faulty.end(), isOrnamented))
        advice.emplace_back(kPlainNumbers);
    return table.MakeFailure(fmt::format("{} columns cannot be binned as they are: {}; {}", faulty.size(),
                                         Join(described, ", "), Join(advice, ", ")));
}

} // namespace

void ThrowIfFaulty(const TableReader& table, const ColumnPlan& plan)
{
    std::vector<FaultyColumn> faulty;
    for (std::size_t i = 0; i < plan.columns.size(); ++i)
    {
        if (const Fault fault = FindFault(plan, plan.columns[i]); fault != Fault::kNone)
            faulty.push_back({i, fault});
    }
    if (faulty.size() == 1)
        throw MakeFailure(table, plan.columns[faulty.front().position], faulty.front());
    if (!faulty.empty())
        throw MakeFailure(table, plan, faulty);
}
