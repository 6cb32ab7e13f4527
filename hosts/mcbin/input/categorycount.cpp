#include "hosts/mcbin/input/categorycount.h"

#include "bins/categoryorder.h"
#include "bins/categorytally.h"
#include "hosts/mcbin/input/columnplan.h"
#include "hosts/mcbin/input/recordsource.h"
#include "hosts/mcbin/input/variables.h"
#include "hosts/mcbin/progress.h"

#include <algorithm>
#include <string>
#include <vector>

namespace
{

/// Whether the categories of an attribute have no order of their own. Categories that are numbers have one.
bool IsUnordered(const Column& column, const NumberForm& numbers)
{
    return column.isAttribute && !column.isTarget && column.kind == ColumnKind::kCategorical && column.order.empty() &&
           !Categories(column, numbers).AreNumbers();
}

/// The plan with the columns alone that have to be counted, and the targets and the weight. Numbers need not be parsed.
ColumnPlan MakeCountPlan(const ColumnPlan& plan)
{
    ColumnPlan counted = plan;
    for (Column& column : counted.columns) column.isAttribute = IsUnordered(column, plan.numbers);
    return counted;
}

/// The attributes, each with the target whose rates order its categories, if there is one.
std::vector<CategoryTally::Pair> FindPairs(const Variables& variables,
                                           const std::vector<std::shared_ptr<const Variable>>& described)
{
    std::vector<CategoryTally::Pair> pairs;
    const auto isKnown = [&pairs](int attribute)
    {
        return std::any_of(pairs.begin(), pairs.end(),
                           [=](const CategoryTally::Pair& pair) { return pair.attribute == attribute; });
    };
    for (std::size_t i = 0; i < variables.pairAttributes.size(); ++i)
    {
        if (!isKnown(variables.pairAttributes[i]))
            pairs.push_back({variables.pairAttributes[i], variables.pairTargets[i]});
    }
    const int target = variables.list.GetTargetIndex();
    for (std::size_t i = 0; i < described.size() && variables.pairAttributes.empty(); ++i)
    {
        if (described[i]->role == VariableRole::kAttribute)
            pairs.push_back({static_cast<int>(i), target < 0 ? std::nullopt : std::optional(target)});
    }
    return pairs;
}

} // namespace

void OrderCategories(TableReader& table, ColumnPlan& plan, Progress& progress)
{
    const ColumnPlan counted = MakeCountPlan(plan);
    const auto isAttribute = [](const Column& column) { return column.isAttribute; };
    const bool areCounted = plan.isByRate || plan.rareShare > 0.0;
    if (!areCounted || std::none_of(counted.columns.begin(), counted.columns.end(), isAttribute))
        return;
    Variables variables = MakeVariables(counted);
    const std::vector<std::shared_ptr<const Variable>> described = DescribeVariables(counted, variables);
    const std::vector<CategoryTally::Pair> pairs = FindPairs(variables, described);
    CategoryTally tally(described, pairs);
    progress.BeginRows("counting the categories");
    TableRecordSource records(table, counted, variables, progress);
    while (records.HasNext())
    {
        tally.Add(*records.Next());
        progress.CountRow();
    }
    for (const CategoryTally::Pair& pair : pairs)
    {
        const auto attribute = static_cast<std::size_t>(pair.attribute);
        Column& column = plan.columns[variables.columns[attribute]];
        const CategoryCodes codes =
            MakeCategoryCodes(described[attribute]->categories, *tally.Find(pair), true, plan.rareShare, plan.isByRate);
        if (codes.names.size() < 2 && !column.isNamed)
        {
            column.isAttribute = false;
            column.reasonLeftOut = "rare categories alone";
            continue;
        }
        column.order = codes.names;
        column.rare = codes.rare;
        column.rareName = codes.rareCode ? codes.names[*codes.rareCode] : "";
        column.orderTarget = plan.isByRate ? described[static_cast<std::size_t>(*pair.target)]->name : "";
    }
}
