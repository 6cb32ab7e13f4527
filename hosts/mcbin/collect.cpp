#include "hosts/mcbin/collect.h"

#include "bins/infinitevalues.h"
#include "bins/numbers.h"
#include "bins/weightgrid.h"
#include "hosts/mcbin/figures.h"
#include "hosts/mcbin/findings.h"
#include "hosts/mcbin/input/columnplan.h"
#include "hosts/mcbin/input/variables.h"

#include <mcobnqrt/mcobnqrt.h>

#include <cmath>
#include <limits>
#include <utility>

namespace
{

constexpr double kInfinity = std::numeric_limits<double>::infinity();

VariableRole GetRole(IBINVariable::VariableRole role)
{
    switch (role)
    {
    case IBINVariable::RoleTarget:
        return VariableRole::kTarget;
    case IBINVariable::RoleFrequencyWeight:
        return VariableRole::kWeight;
    default: // the tool gives no other role
        return VariableRole::kAttribute;
    }
}

/// The library holds an infinite end as the largest finite number.
double GetEnd(double end)
{
    return std::fabs(end) == std::numeric_limits<double>::max() ? std::copysign(kInfinity, end) : end;
}

void AddMissing(Variable& variable, const IBINUserMissing* missing)
{
    if (const auto* const numeric = dynamic_cast<const BINNumericUserMissing*>(missing))
    {
        for (const double number : numeric->GetDiscreteValues())
            variable.missingNumbers.push_back(DecodeInfinity(number));
        if (const BINNumericInterval* const interval = numeric->GetInterval())
            variable.missingInterval = {GetEnd(interval->GetLeftEnd()), GetEnd(interval->GetRightEnd())};
    }
    if (const auto* const strings = dynamic_cast<const BINStringUserMissing*>(missing))
        variable.missingTexts = strings->GetDiscreteValues();
}

/// What the encoder of a variable adds; a continuous one has none.
void AddEncoder(Variable& variable, const IBINEncoder* encoder)
{
    if (const auto* const strings = dynamic_cast<const BINStringEncoder*>(encoder))
    {
        variable.kind = VariableKind::kStringCategorical;
        for (int code = 0; code < strings->GetNumberOfCategories(); ++code)
            variable.categories.push_back(strings->Decode(code));
    }
}

std::optional<double> GetFigure(double figure)
{
    return figure == MCMV::gMissingValue ? std::nullopt : std::optional(DecodeInfinity(figure));
}

template<class LibraryResult>
Result MakeResult(const Findings& findings, const LibraryResult& result, const InfiniteValues& values)
{
    Result made;
    made.status = result.GetStatus();
    made.attribute = result.GetAttributeIndex();
    made.distinctValues = result.GetNDistinctValues();
    made.weight = result.GetTotalWeight();
    made.weightWithMissing = result.GetTotalWeightWithMissing();
    for (const double cutPoint : result.GetCutPoints())
        made.cutPoints.push_back(values.DecodeCutPoint(cutPoint, findings.settings.isRightClosed));
    // With an error they are 0, which is no figure.
    if (!made.status.IsError())
    {
        made.minimum = GetFigure(result.GetMinimum());
        made.maximum = GetFigure(result.GetMaximum());
    }
    return made;
}

void AddBin(Result& result, double weight, std::vector<double> weights)
{
    const std::size_t place = result.bins.size();
    Bin bin;
    bin.left = place == 0 ? -kInfinity : result.cutPoints[place - 1];
    bin.right = place == result.cutPoints.size() ? kInfinity : result.cutPoints[place];
    bin.weight = weight;
    bin.weights = std::move(weights);
    result.bins.push_back(bin);
}

/// The library takes numbers alone as missing values of a variable that has no categories; the texts stand beside them.
void AddMissingTexts(Variable& variable, const Column& column)
{
    if (variable.IsCategorical())
        return;
    for (const std::string& text : column.missingTexts)
        if (!ParseNumber(text))
            variable.missingTexts.push_back(text);
}

/// The weights of a row of the table by category. The table has no columns for the last categories if no record that
/// counts is of them.
std::vector<double> GetCategoryWeights(const std::vector<double>& row, const Variable& target)
{
    std::vector<double> weights(row.begin() + 1, row.end());
    weights.resize(target.categories.size());
    return weights;
}

bool IsIn(const Findings& findings, int index)
{
    return index >= 0 && static_cast<std::size_t>(index) < findings.variables.size();
}

} // namespace

void AddPlan(Findings& findings, const ColumnPlan& plan)
{
    findings.records = plan.nRows;
    findings.missingText = plan.missingTexts;
    findings.leftOut = plan.DescribeLeftOut();
}

void AddVariables(Findings& findings, const ColumnPlan& plan, const Variables& variables)
{
    const BINVarList& list = variables.list;
    for (int i = 0; i < static_cast<int>(list.Size()); ++i)
    {
        const IBINVariable& source = *list.GetVarAt(i);
        Variable variable;
        variable.name = source.GetVariableName();
        variable.label = source.GetVariableLabel();
        variable.role = GetRole(source.GetVariableRole());
        AddEncoder(variable, list.GetEncoderAt(i));
        if (variable.role == VariableRole::kWeight)
        {
            const Column& column = plan.columns[variables.columns[static_cast<std::size_t>(i)]];
            findings.recordsWithoutWeight = plan.nWithoutWeight;
            variable.kind = VariableKind::kWeight;
            variable.rounding = GetName(plan.weights.rounding);
            variable.missingNumbers = column.missingNumbers;
            variable.missingInterval = column.missingInterval;
        }
        AddMissing(variable, source.GetUserMissingInfo());
        AddMissingTexts(variable, plan.columns[variables.columns[static_cast<std::size_t>(i)]]);
        findings.variables.push_back(variable);
    }
}

void AddWeightGrid(Findings& findings, const WeightGrid& grid)
{
    for (Variable& variable : findings.variables)
        if (variable.role == VariableRole::kWeight)
            variable.weightGrid = grid.GetStep();
}

void AddResult(Findings& findings, const BINAttributeTargetResults& result, const std::vector<InfiniteValues>& values)
{
    if (!IsIn(findings, result.GetAttributeIndex()) || !IsIn(findings, result.GetTargetIndex()))
        return;
    Result made = MakeResult(findings, result, values[static_cast<std::size_t>(result.GetAttributeIndex())]);
    made.target = result.GetTargetIndex();
    // A row of a table that wasn't filled is empty.
    for (const std::vector<double>& row : result.GetCellCounts())
        if (!row.empty())
            AddBin(made, row.front(), GetCategoryWeights(row, *findings.FindTarget(made)));
    if (!made.bins.empty())
    {
        made.targetEntropy = GetEntropy(GetCategoryWeights(made));
        made.modelEntropy = GetFigure(result.GetModelEntropy());
    }
    findings.results.push_back(made);
}

void AddResult(Findings& findings, const BINAttributeResults& result, const std::vector<InfiniteValues>& values)
{
    if (!IsIn(findings, result.GetAttributeIndex()))
        return;
    Result made = MakeResult(findings, result, values[static_cast<std::size_t>(result.GetAttributeIndex())]);
    for (const double weight : result.GetCellCounts()) AddBin(made, weight, {});
    findings.results.push_back(made);
}
