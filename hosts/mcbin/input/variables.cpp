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

void ThrowIfTooFew(const Column& column, const std::vector<std::string>& categories)
{
    const std::string what = column.isTarget ? "target" : "categorical attribute";
    if (categories.empty())
        throw Failure("column " + Quote(column.name) + " has no value; a " + what + " needs at least 2 categories");
    if (categories.size() == 1)
    {
        throw Failure("column " + Quote(column.name) + " has a single category, " + Quote(categories.front()) + "; a " +
                      what + " needs at least 2");
    }
}

/// Neither of the named options: the library counts a weight as the record source hands it on, rounded by then.
constexpr auto kUnrounded = static_cast<IBINVariable::BINWRoundingOption>(2);

/// With a list of pairs no variable is the target of the list. `categories` are null for a column that has none.
int AddVariable(BINVarList& list, const Column& column, const Categories* categories, bool hasPairs)
{
    if (column.isWeight)
        return list.AddWeightVar(column.name, "", kUnrounded);
    if (!categories)
        return list.AddContVar(column.name, "", IBINVariable::RoleAttribute);
    ThrowIfTooFew(column, categories->GetNames());
    const bool isTarget = column.isTarget && !hasPairs;
    return list.AddCatVar(column.name, "", categories->GetNames(),
                          isTarget ? IBINVariable::RoleTarget : IBINVariable::RoleAttribute);
}

/// The library holds an infinite end as the largest finite number.
double GetEnd(double end)
{
    constexpr double kLargest = std::numeric_limits<double>::max();
    return std::clamp(end, -kLargest, kLargest);
}

/// The record source leaves out the missing values of a weight, as the library would look for them among the rounded
/// ones, and those of a categorical column.
void DeclareMissing(BINVarList& list, int index, const Column& column, const Categories* categories)
{
    if (categories && !categories->AreNumbers() && column.missingInterval)
    {
        throw Failure("column " + Quote(column.name) +
                      " is categorical, and so its missing values can't be declared as an interval");
    }
    if (column.isWeight || categories)
        return;
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

VariableRole GetRole(const Column& column, bool hasPairs)
{
    if (column.isWeight)
        return VariableRole::kWeight;
    return column.isTarget && !hasPairs ? VariableRole::kTarget : VariableRole::kAttribute;
}

VariableKind GetKind(const Column& column, const Categories* categories)
{
    if (column.isWeight)
        return VariableKind::kWeight;
    if (!categories)
        return VariableKind::kContinuous;
    return categories->AreNumbers() ? VariableKind::kNumericCategorical : VariableKind::kStringCategorical;
}

Variable DescribeVariable(const Column& column, const Categories* categories, const ColumnPlan& plan)
{
    Variable variable;
    variable.name = column.name;
    variable.role = GetRole(column, !plan.pairs.empty());
    variable.kind = GetKind(column, categories);
    if (column.isWeight)
    {
        variable.rounding = plan.weights.rounding;
        variable.isScaledToRecords = plan.isWeightScaled;
    }
    if (categories)
        variable.categories = categories->GetNames();
    if (variable.kind == VariableKind::kStringCategorical)
    {
        variable.missingTexts = column.missingTexts;
        variable.orderTarget = column.orderTarget;
        const bool isDeclared = !column.order.empty() && column.orderTarget.empty() && column.rare.empty();
        variable.categoryOrder = isDeclared                   ? CategoryOrder::kDeclared
                                 : column.orderTarget.empty() ? CategoryOrder::kText
                                                              : CategoryOrder::kRate;
        if (!column.rare.empty())
        {
            const auto found = std::find(column.order.begin(), column.order.end(), column.rareName);
            const auto code = static_cast<std::size_t>(found - column.order.begin());
            variable.rare = RareCategories{code, plan.rareShare, column.rare};
        }
        return variable;
    }
    variable.missingNumbers = column.missingNumbers;
    variable.missingInterval = column.missingInterval;
    // The numbers among the texts are told as numbers.
    for (const std::string& text : column.missingTexts)
    {
        if (!ParseNumber(text))
            variable.missingTexts.push_back(text);
    }
    return variable;
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
        variables.columns.push_back(i);
        std::optional<Categories>& categories = variables.categories.emplace_back();
        if (column.kind == ColumnKind::kCategorical && !column.isWeight)
            categories.emplace(column, plan.numbers);
        const Categories* const known = categories ? &*categories : nullptr;
        variableOfColumn[i] = AddVariable(variables.list, column, known, !plan.pairs.empty());
        DeclareMissing(variables.list, variableOfColumn[i], column, known);
    }
    if (!hasAttribute)
    {
        const std::vector<std::string> leftOut = plan.DescribeLeftOut();
        const auto isOrnamented = [](const Column& column) { return column.IsOrnamented(); };
        const bool isAny = std::any_of(plan.columns.begin(), plan.columns.end(), isOrnamented);
        throw Failure("there is nothing to bin: no column could be an attribute" +
                      (leftOut.empty() ? "" : "; left out: " + Join(leftOut, ", ")) +
                      (isAny ? std::string("; ") + kPlainNumbers : ""));
    }
    AddPairs(variables, plan, variableOfColumn);
    return variables;
}

std::vector<std::shared_ptr<const Variable>> DescribeVariables(const ColumnPlan& plan, const Variables& variables)
{
    std::vector<std::shared_ptr<const Variable>> described;
    for (std::size_t i = 0; i < variables.columns.size(); ++i)
    {
        const std::optional<Categories>& categories = variables.categories[i];
        const Column& column = plan.columns[variables.columns[i]];
        described.push_back(
            std::make_shared<const Variable>(DescribeVariable(column, categories ? &*categories : nullptr, plan)));
    }
    return described;
}
