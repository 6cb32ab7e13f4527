#include "hosts/mcbin/input/recordsource.h"

#include "hosts/mcbin/input/columnplan.h"
#include "hosts/mcbin/input/tableprofile.h"
#include "hosts/mcbin/input/tablereader.h"
#include "hosts/mcbin/input/variables.h"
#include "hosts/mcbin/progress.h"

#include <cmath>

namespace
{

constexpr const char* kChanged = "the file has changed while it was read";

} // namespace

TableRecordSource::TableRecordSource(TableReader& table, const ColumnPlan& plan, Variables& variables,
                                     Progress& progress)
    : fTable(table), fPlan(plan), fProgress(progress), fWeightGrid(plan.weights), fValues(variables.columns.size()),
      fRowsLeft(plan.numRows), fRecord(static_cast<int>(variables.columns.size()))
{
    for (std::size_t i = 0; i < variables.columns.size(); ++i)
    {
        std::optional<Categories>& categories = variables.categories[i];
        fFields.push_back({variables.columns[i], &plan.columns[variables.columns[i]],
                           categories ? &*categories : nullptr, MergeWatch()});
    }
    fTable.Rewind();
}

bool TableRecordSource::HasNext()
{
    if (fRow)
        return true;
    fRow = fTable.NextRow();
    if (fRow ? fRowsLeft == 0 : fRowsLeft != 0)
        throw fTable.MakeFailure(kChanged);
    if (!fRow)
        fProgress.BeginAttributes();
    return fRow != nullptr;
}

const MCCommon::Record* TableRecordSource::Next()
{
    if (!HasNext())
        return nullptr;
    for (std::size_t i = 0; i < fFields.size(); ++i)
        fRecord[static_cast<int>(i)] = Convert(fFields[i], (*fRow)[fFields[i].position], fValues[i]);
    --fRowsLeft;
    fRow = nullptr;
    return &fRecord;
}

double TableRecordSource::Convert(Field& field, std::string_view text, InfiniteValues& values)
{
    if (fPlan.IsMissing(*field.column, text))
        return MCMV::gMissingValue;
    if (field.categories)
        return ConvertCategory(field, text);
    const double number = fPlan.numbers.Parse(text);
    if (!std::isnan(number))
    {
        field.merges.Look(text, number);
        return ConvertNumber(field, number, values);
    }
    if (field.column->isBelieved)
        throw NotOnlyNumbers();
    if (!fPlan.isBadMissing)
        throw fTable.MakeFailure(fRow->GetLine(), kChanged);
    return MCMV::gMissingValue;
}

double TableRecordSource::ConvertNumber(const Field& field, double number, InfiniteValues& values)
{
    // Of what can't be a weight, the first pass has let through only what is missing.
    const bool isMissing =
        field.column->isWeight ? !ColumnPlan::IsWeight(*field.column, number) : field.column->IsMissing(number);
    if (isMissing)
        return MCMV::gMissingValue;
    if (!field.column->isWeight)
        return values.Encode(number);
    fNumWeighted += number > 0.0 ? 1 : 0;
    return fWeightGrid.Round(number);
}

double TableRecordSource::ConvertCategory(Field& field, std::string_view text)
{
    const std::optional<double> code = field.categories->FindCode(text);
    if (!code)
        throw fTable.MakeFailure(fRow->GetLine(), kChanged);
    return *code;
}
