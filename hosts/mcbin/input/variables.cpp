#include "hosts/mcbin/input/variables.h"

#include "bins/infinitevalues.h"
#include "bins/numbers.h"
#include "hosts/mcbin/failure.h"
#include "hosts/mcbin/input/columnplan.h"
#include "hosts/mcbin/text.h"

#include <mcobnqrt/ibinvariable.h>

#include <algorithm>
#include <limits>
#include <string>

namespace
{

std::vector<std::string> GetCategories(const Column& column)
{
    const std::string what = column.isTarget ? "target" : "categorical attribute";
    if (column.categories.empty())
        throw Failure("column " + Quote(column.name) + " has no value; a " + what + " needs at least 2 categories");
    if (column.categories.size() == 1)
        throw Failure("column " + Quote(column.name) + " has a single category, " + Quote(*column.categories.begin()) +
                      "; a " + what + " needs at least 2");
    return {column.categories.begin(), column.categories.end()};
}

/// Neither of the named options: the library counts a weight as the record source hands it on, rounded by then.
constexpr auto kUnrounded = static_cast<IBINVariable::BINWRoundingOption>(2);

/// With a list of pairs no variable is the target of the list.
int AddVariable(BINVarList& list, const Column& column, bool hasPairs)
{
    if (column.isWeight)
        return list.AddWeightVar(column.name, "", kUnrounded);
    if (column.kind == ColumnKind::kContinuous)
        return list.AddContVar(column.name, "", IBINVariable::RoleAttribute);
    const bool isTarget = column.isTarget && !hasPairs;
    return list.AddCatVar(column.name, "", GetCategories(column),
                          isTarget ? IBINVariable::RoleTarget : IBINVariable::RoleAttribute);
}

/// The library holds an infinite end as the largest finite number.
double GetEnd(double end)
{
    constexpr double kLargest = std::numeric_limits<double>::max();
    return std::clamp(end, -kLargest, kLargest);
}

/// The record source leaves out the missing values of a weight, as the library would look for them among the rounded
/// ones.
void DeclareMissing(BINVarList& list, int index, const Column& column)
{
    if (column.isWeight)
        return;
    if (column.kind == ColumnKind::kCategorical)
    {
        for (const std::string& text : column.missingTexts) list.AddDiscreteUserMissing(index, text, "");
        if (column.missingInterval)
            throw Failure("column " + Quote(column.name) +
                          " is categorical, and so its missing values can't be declared as an interval");
        return;
    }
    for (const double number : column.missingNumbers) list.AddDiscreteUserMissing(index, EncodeInfinity(number), "");
    if (column.missingInterval)
        list.SetMissingInterval(index, GetEnd(column.missingInterval->first), GetEnd(column.missingInterval->second));
}

void AddPairs(Variables& variables, const ColumnPlan& plan, const std::vector<int>& variableOfColumn)
{
    for (const auto& [attribute, target] : plan.pairs)
    {
        if (!plan.columns[attribute].isAttribute)
            continue; // it turned out to be text
        variables.pairAttributes.push_back(variableOfColumn[attribute]);
        variables.pairTargets.push_back(variableOfColumn[target]);
    }
}

} // namespace

Variables MakeVariables(const ColumnPlan& plan)
{
    Variables variables;
    std::vector<int> variableOfColumn(plan.columns.size(), -1);
    bool hasAttribute = false;
    for (std::size_t i = 0; i < plan.columns.size(); ++i)
    {
        const Column& column = plan.columns[i];
        if (!column.IsUsed())
            continue;
        hasAttribute = hasAttribute || column.isAttribute;
        variableOfColumn[i] = AddVariable(variables.list, column, !plan.pairs.empty());
        DeclareMissing(variables.list, variableOfColumn[i], column);
        variables.columns.push_back(i);
    }
    if (!hasAttribute)
    {
        const std::vector<std::string> leftOut = plan.DescribeLeftOut();
        const auto isOrnamented = [](const Column& column) { return column.IsOrnamented(); };
        const bool isAny = std::any_of(plan.columns.begin(), plan.columns.end(), isOrnamented);
        throw Failure("there is nothing to bin: no column that could be an attribute has numbers" +
                      (leftOut.empty() ? "" : "; they hold text: " + Join(leftOut, ", ")) +
                      (isAny ? std::string("; ") + kPlainNumbers : ""));
    }
    AddPairs(variables, plan, variableOfColumn);
    return variables;
}
