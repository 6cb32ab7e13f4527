#include "hosts/mcbin/input/columnplan.h"

#include "bins/numbers.h"
#include "bins/utf8.h"
#include "hosts/mcbin/failure.h"
#include "hosts/mcbin/input/tablereader.h"
#include "hosts/mcbin/options.h"
#include "hosts/mcbin/text.h"

#include <algorithm>
#include <cmath>
#include <limits>

namespace
{

using Indices = std::vector<std::size_t>;

bool HasColumn(const TableReader& table, const std::string& name)
{
    const std::vector<std::string>& names = table.GetColumnNames();
    return std::find(names.begin(), names.end(), name) != names.end();
}

Indices FindMatches(const TableReader& table, const std::string& pattern)
{
    const std::vector<std::string>& names = table.GetColumnNames();
    Indices found;
    if (IsPattern(pattern))
    {
        for (std::size_t i = 0; i < names.size(); ++i)
        {
            if (Matches(pattern, names[i]))
                found.push_back(i);
        }
    }
    return found;
}

/// The columns that a name or pattern stands for. The name of a column such as "a[1]" stands for that column; where it
/// matches others as a pattern, there is no telling which is meant.
Indices FindColumns(const TableReader& table, const std::string& pattern)
{
    Indices matches = FindMatches(table, pattern);
    if (!matches.empty() && !HasColumn(table, pattern))
        return matches;
    const std::size_t own = table.FindColumn(pattern);
    for (const std::size_t other : matches)
    {
        if (other != own)
        {
            throw Failure(Quote(pattern) + " is the name of a column, and a pattern that " +
                          Quote(table.GetColumnNames()[other]) + " matches, too; " + Quote(EscapePattern(pattern)) +
                          " stands for the column alone");
        }
    }
    return {own};
}

/// The names and patterns of a list, split at its commas where it isn't the name of a column as it stands.
std::vector<std::string> SplitNames(const TableReader& table, const std::vector<std::string>& lists)
{
    std::vector<std::string> names;
    for (const std::string& list : lists)
    {
        const std::vector<std::string> parts =
            HasColumn(table, list) ? std::vector<std::string>{list} : Split(list, ',');
        names.insert(names.end(), parts.begin(), parts.end());
    }
    return names;
}

Indices FindColumns(const TableReader& table, const std::vector<std::string>& lists)
{
    Indices found;
    for (const std::string& pattern : SplitNames(table, lists))
    {
        for (const std::size_t column : FindColumns(table, pattern)) found.push_back(column);
    }
    return found;
}

void SetKind(ColumnPlan& plan, const Indices& columns, ColumnKind kind)
{
    for (const std::size_t i : columns)
    {
        Column& column = plan.columns[i];
        if (column.kind != ColumnKind::kUnknown && column.kind != kind)
            throw Failure("column " + Quote(column.name) + " cannot be both categorical and continuous");
        column.kind = kind;
    }
}

void SetKinds(ColumnPlan& plan, const TableReader& table, const ColumnOptions& options)
{
    SetKind(plan, FindColumns(table, options.categorical), ColumnKind::kCategorical);
    SetKind(plan, FindColumns(table, options.continuous), ColumnKind::kContinuous);
}

void SetTarget(Column& column)
{
    if (column.isWeight)
        throw Failure("column " + Quote(column.name) + " cannot be both target and weight");
    column.isTarget = true;
    column.kind = ColumnKind::kCategorical; // a target always is, even if it was said to be continuous
}

void SetTargetAndWeight(ColumnPlan& plan, const TableReader& table, const ColumnOptions& options)
{
    if (!options.weight.empty())
    {
        Column& weight = plan.columns[table.FindColumn(options.weight)];
        weight.isWeight = true;
        weight.kind = ColumnKind::kContinuous;
    }
    if (!options.target.empty())
        SetTarget(plan.columns[table.FindColumn(options.target)]);
}

/// Where ATTRIBUTE:TARGET is split: names may hold colons, so it is where a column's name follows.
std::pair<std::string, std::string> SplitPair(const TableReader& table, const std::string& pair)
{
    for (std::size_t at = pair.find(':'); at != std::string::npos; at = pair.find(':', at + 1))
    {
        if (HasColumn(table, pair.substr(at + 1)))
            return {pair.substr(0, at), pair.substr(at + 1)};
    }
    const std::size_t colon = pair.find(':');
    if (colon == std::string::npos)
        throw Failure("a pair is written ATTRIBUTE:TARGET, which " + Quote(pair) + " is not");
    table.FindColumn(pair.substr(colon + 1)); // tells that there is no such column
    return {};
}

void SetPairs(ColumnPlan& plan, const TableReader& table, const ColumnOptions& options)
{
    std::vector<std::pair<std::string, std::size_t>> pairs;
    for (const std::string& pair : options.pairs)
    {
        const auto [attribute, target] = SplitPair(table, pair);
        pairs.emplace_back(attribute, table.FindColumn(target));
        SetTarget(plan.columns[pairs.back().second]);
    }
    for (const auto& [pattern, target] : pairs)
    {
        for (const std::size_t i : FindColumns(table, pattern))
        {
            Column& column = plan.columns[i];
            const bool isNamed = column.name == pattern;
            if (!isNamed && (column.isWeight || column.isTarget))
                continue;
            if (column.isWeight || i == target)
            {
                throw Failure("column " + Quote(column.name) + " cannot be an attribute in " +
                              Quote(pattern + ":" + plan.columns[target].name));
            }
            column.isAttribute = true;
            column.isNamed = column.isNamed || isNamed;
            const std::pair<std::size_t, std::size_t> found(i, target);
            if (std::find(plan.pairs.begin(), plan.pairs.end(), found) == plan.pairs.end())
                plan.pairs.push_back(found);
        }
    }
}

void SetAttributes(ColumnPlan& plan, const TableReader& table, const ColumnOptions& options)
{
    if (options.attributes.empty())
    {
        for (Column& column : plan.columns) column.isAttribute = !column.isTarget && !column.isWeight;
    }
    for (const std::string& pattern : SplitNames(table, options.attributes))
    {
        for (const std::size_t i : FindColumns(table, pattern))
        {
            Column& column = plan.columns[i];
            const bool isFree = !column.isTarget && !column.isWeight;
            if (!isFree && column.name == pattern)
            {
                throw Failure("column " + Quote(column.name) +
                              " cannot be an attribute: it is the target or the weight");
            }
            column.isAttribute = column.isAttribute || isFree;
            column.isNamed = column.isNamed || column.name == pattern;
        }
    }
    for (const std::size_t i : FindColumns(table, options.exclude)) plan.columns[i].isAttribute = false;
}

double ParseEnd(std::string_view text, double absent, const std::string& declaration)
{
    const std::optional<double> end = text.empty() ? absent : ParseNumber(text);
    if (!end)
    {
        throw Failure("an interval of missing values is written LOW:HIGH, with numbers, which is not so in " +
                      Quote(declaration));
    }
    return *end;
}

/// Whether it is LOW:HIGH; one end may be left out for an infinite one.
bool IsInterval(std::string_view value)
{
    const std::size_t colon = value.find(':');
    return colon != std::string_view::npos && value.size() > 1 && (colon == 0 || ParseNumber(value.substr(0, colon))) &&
           (colon + 1 == value.size() || ParseNumber(value.substr(colon + 1)));
}

/// The number joins those that are missing in the column, if it isn't there yet.
void AddMissingNumber(Column& column, const std::string& text)
{
    const std::optional<double> number = ParseNumber(text);
    std::vector<double>& numbers = column.missingNumbers;
    if (number && std::find(numbers.begin(), numbers.end(), *number) == numbers.end())
        numbers.push_back(*number);
}

void DeclareMissing(Column& column, const std::string& value, const std::string& declaration)
{
    if (IsInterval(value))
    {
        const std::size_t colon = value.find(':');
        if (column.missingInterval)
            throw Failure("column " + Quote(column.name) + " has more than one interval of missing values");
        constexpr double kInfinite = std::numeric_limits<double>::infinity();
        column.missingInterval = {ParseEnd(value.substr(0, colon), -kInfinite, declaration),
                                  ParseEnd(value.substr(colon + 1), kInfinite, declaration)};
        if (column.missingInterval->first > column.missingInterval->second)
            throw Failure("the interval of missing values in " + Quote(declaration) + " is empty");
    }
    else
    {
        column.missingTexts.push_back(value);
        AddMissingNumber(column, value);
    }
}

void DeclareMissing(ColumnPlan& plan, const TableReader& table, const std::string& declaration)
{
    const std::size_t equals = declaration.rfind('=');
    if (equals == std::string::npos || equals + 1 == declaration.size())
    {
        throw Failure("missing values are declared as COLUMN=9,99 or COLUMN=90:99, which " + Quote(declaration) +
                      " is not");
    }
    for (const std::size_t column : FindColumns(table, declaration.substr(0, equals)))
    {
        for (const std::string& value : Split(std::string_view(declaration).substr(equals + 1), ','))
            DeclareMissing(plan.columns[column], value, declaration);
    }
}

/// Where COLUMN=a,b,c is split: names may hold such signs, so it is where a column's name ends.
std::pair<std::size_t, std::string> SplitOrder(const TableReader& table, const std::string& declaration)
{
    for (std::size_t at = declaration.find('='); at != std::string::npos; at = declaration.find('=', at + 1))
    {
        const std::string name = declaration.substr(0, at);
        if (HasColumn(table, name))
            return {table.FindColumn(name), declaration.substr(at + 1)};
    }
    return {table.FindColumn(declaration.substr(0, declaration.find('='))), {}}; // tells that there is no such column
}

void DeclareOrder(ColumnPlan& plan, const TableReader& table, const std::string& declaration)
{
    if (declaration == "rate" || declaration == "text")
    {
        plan.isByRate = declaration == "rate";
        return;
    }
    if (declaration.find('=') == std::string::npos)
        throw Failure("an order of categories is rate, text or COLUMN=a,b,c, which " + Quote(declaration) + " is not");
    const auto [position, categories] = SplitOrder(table, declaration);
    Column& column = plan.columns[position];
    column.order = Split(categories, ',');
    const std::set<std::string> different(column.order.begin(), column.order.end());
    if (different.size() < column.order.size())
        throw Failure("the order of the categories in " + Quote(declaration) + " names one of them twice");
    SetKind(plan, {position}, ColumnKind::kCategorical);
}

void ThrowUnlessText(const std::string& text, const std::string& what)
{
    if (!IsText(text))
        throw Failure(what + " " + Quote(text) + " is not UTF-8 text");
}

/// What isn't UTF-8 couldn't be handed on: JSON and the page can't hold it.
void ThrowUnlessText(const ColumnPlan& plan)
{
    for (const std::string& text : plan.missingTexts) ThrowUnlessText(text, "the text for missing values");
    for (const Column& column : plan.columns)
    {
        if (column.IsUsed())
            ThrowUnlessText(column.name, "the name of column");
        for (const std::string& text : column.missingTexts) ThrowUnlessText(text, "the text for missing values");
        for (const std::string& text : column.order) ThrowUnlessText(text, "the category");
    }
}

} // namespace

bool Column::IsMissing(double number) const
{
    return (missingInterval && number >= missingInterval->first && number <= missingInterval->second) ||
           (!missingNumbers.empty() &&
            std::find(missingNumbers.begin(), missingNumbers.end(), number) != missingNumbers.end());
}

bool ColumnPlan::IsWeight(const Column& column, double number)
{
    return number >= 0.0 && std::isfinite(number) && !column.IsMissing(number);
}

std::vector<std::string> ColumnPlan::DescribeLeftOut() const
{
    std::vector<std::string> described;
    for (const Column& column : columns)
    {
        if (column.numTexts > 0 && !column.IsUsed())
        {
            described.push_back(Printable(column.name) + " (" + column.reasonLeftOut + ", such as " +
                                Quote(Shorten(column.firstText)) + " in line " + std::to_string(column.firstTextLine) +
                                ")");
        }
    }
    return described;
}

bool ColumnPlan::IsIn(const std::vector<std::string>& texts, std::string_view field)
{
    return std::find(texts.begin(), texts.end(), field) != texts.end();
}

ColumnPlan PlanColumns(const TableReader& table, const ColumnOptions& options)
{
    ColumnPlan plan;
    plan.missingTexts = options.missingText;
    plan.isBadMissing = options.isBadMissing;
    plan.numbers = table.GetNumberForm();
    plan.areTextsBinned = options.areTextsBinned;
    plan.isByRate = options.areTextsBinned;
    plan.rareShare = options.rareShare;
    plan.weights.rounding = options.rounding;
    plan.isWeightScaled = options.isWeightScaled;
    for (const std::string& name : table.GetColumnNames())
    {
        plan.columns.emplace_back();
        plan.columns.back().name = name;
    }
    SetKinds(plan, table, options);
    SetTargetAndWeight(plan, table, options);
    if (options.pairs.empty())
        SetAttributes(plan, table, options);
    else
        SetPairs(plan, table, options);
    for (const std::string& declaration : options.categoryOrder) DeclareOrder(plan, table, declaration);
    for (const std::string& declaration : options.missing) DeclareMissing(plan, table, declaration);
    // A database, or any other reader of typed columns, sees the number and not the text that stands for it here.
    for (Column& column : plan.columns)
    {
        for (const std::string& text : plan.missingTexts) AddMissingNumber(column, text);
    }
    ThrowUnlessText(plan);
    return plan;
}
