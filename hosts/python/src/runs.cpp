#include "hosts/python/src/runs.h"

#include "bins/numbers.h"
#include "bins/run.h"

#include <mcobnqrt/mcobnqrt.h>

namespace
{

/// Neither of the named options: the library counts a weight as it comes, rounded by then.
constexpr auto kUnrounded = static_cast<IBINVariable::BINWRoundingOption>(2);

/// The list wants names that differ, and a table may have two alike or an empty one: here each is its number. What is
/// missing comes as a number that says so already.
BINVarList MakeList(const std::vector<Field>& fields)
{
    BINVarList list;
    for (std::size_t i = 0; i < fields.size(); ++i)
    {
        const Field& field = fields[i];
        const std::string name = std::to_string(i);
        switch (field.use)
        {
        case Field::Use::kAttribute:
            list.AddContVar(name, field.name, IBINVariable::RoleAttribute);
            break;
        case Field::Use::kWeight:
            list.AddWeightVar(name, field.name, kUnrounded);
            break;
        case Field::Use::kCategory:
        case Field::Use::kCode:
            list.AddCatVar(name, field.name, static_cast<int>(field.GetNumCategories()),
                           IBINVariable::MeasureNumericCategorical, IBINVariable::RoleAttribute);
            break;
        }
    }
    return list;
}

VariableKind GetKind(const Field& field)
{
    if (field.use == Field::Use::kWeight)
        return VariableKind::kWeight;
    if (field.use == Field::Use::kAttribute)
        return VariableKind::kContinuous;
    return field.texts.GetSize() > 0 ? VariableKind::kStringCategorical : VariableKind::kNumericCategorical;
}

std::shared_ptr<Variable> MakeVariable(const Field& field, bool isTarget)
{
    auto variable = std::make_shared<Variable>();
    variable->name = field.name;
    variable->kind = GetKind(field);
    if (variable->kind == VariableKind::kWeight)
        variable->role = VariableRole::kWeight;
    else if (isTarget)
        variable->role = VariableRole::kTarget;
    variable->valueKind = field.valueKind;
    variable->timeZone = field.timeZone;
    variable->categories = field.recoding.names.empty() ? field.texts.GetKeys(field.isComplete) : field.recoding.names;
    if (variable->kind == VariableKind::kStringCategorical)
        variable->categoryOrder = field.GetCategoryOrder();
    variable->orderTarget = field.orderTarget;
    variable->rare = field.rare;
    for (const double number : field.numbers.GetKeys(field.isComplete))
        variable->categories.push_back(FormatCategoryNumber(number));
    variable->rounding = field.rounding;
    variable->isScaledToRecords = field.isScaledToRecords;
    variable->missingTexts = field.missingTexts.GetDiscreteValues();
    variable->missingNumbers = field.missingNumbers.GetDiscreteValues();
    variable->missingInterval = field.missingInterval;
    return variable;
}

} // namespace

std::vector<std::shared_ptr<const Variable>> MakeVariables(const std::vector<Field>& fields, std::optional<int> target)
{
    std::vector<std::shared_ptr<const Variable>> variables;
    for (std::size_t i = 0; i < fields.size(); ++i)
        variables.push_back(MakeVariable(fields[i], target == static_cast<int>(i)));
    return variables;
}

void BinFields(Bins& bins, const std::vector<Field>& fields, LibraryBlocks& blocks, const RunRequest& request,
               const nanobind::object& progress, Interrupts& interrupts)
{
    BlockRecords records(blocks, fields.size(), interrupts);
    CancelOnInterrupt cancel(records, interrupts);
    std::optional<ProgressToPython> listener;
    if (!progress.is_none())
        listener.emplace(records, progress);
    RunHost host;
    host.records = &records;
    host.values = &blocks.GetValues();
    host.weightGrid = &blocks.GetWeightGrid();
    host.cancel = &cancel;
    host.listener = listener ? &*listener : nullptr;
    host.tempDirectory = request.tempDir;
    BINVarList list = MakeList(fields);
    RunBinning(bins, list, &request.attributes, &request.targets, host);
    bins.numRecords = records.GetNumRecords();
    bins.numRecordsWithoutWeight = blocks.GetNumWithoutWeight();
}
