#include "hosts/mcbin/input/rowweights.h"

#include "bins/text.h"
#include "hosts/mcbin/input/tablereader.h"
#include "hosts/mcbin/progress.h"

#include <cmath>
#include <memory>
#include <utility>

namespace
{

/// A weight is read as any number is, and so are its missing values.
AttributeBins MakeAttribute(const Variable& weight)
{
    auto variable = std::make_shared<Variable>(weight);
    variable->kind = VariableKind::kContinuous;
    AttributeBins bins;
    bins.attribute = std::move(variable);
    return bins;
}

} // namespace

RowWeights::RowWeights(TableReader& table, const Variable& weight, const std::vector<std::string>& missingTexts,
                       bool isBadMissing, Progress& progress)
    : fTable(&table), fPosition(table.FindColumn(weight.name)), fIsBadMissing(isBadMissing),
      fAsAttribute(MakeAttribute(weight))
{
    fBinner.emplace(fAsAttribute, missingTexts, table.GetNumberForm());
    WeightTally tally;
    tally.rounding = weight.rounding;
    progress.BeginRows("reading the weights");
    while (const CsvRow* const row = table.NextRow())
    {
        progress.CountRow();
        if (const std::optional<double> value = Parse(*row))
            tally.Add(*value);
    }
    table.Rewind();
    fGrid.emplace(tally);
    if (!weight.isScaledToRecords)
        return;
    double total = 0.0;
    while (const CsvRow* const row = table.NextRow()) total += Get(*row).value_or(0.0);
    table.Rewind();
    tally.ScaleToRecords(total);
    fGrid.emplace(tally);
}

std::optional<double> RowWeights::Get(const CsvRow& row)
{
    if (!fTable)
        return 1.0;
    const std::optional<double> weight = Parse(row);
    return weight ? std::optional(fGrid->Round(*weight)) : std::nullopt;
}

std::optional<double> RowWeights::Parse(const CsvRow& row)
{
    const std::string_view field = row[fPosition];
    const Binner::Found found = fBinner->Find(field);
    if (!found.isBad && !found.bin)
        return std::nullopt;
    if (found.bin && found.value >= 0.0 && std::isfinite(found.value))
        return found.value;
    if (fIsBadMissing)
        return std::nullopt;
    if (found.isBad)
        throw fTable->MakeNotANumber(row.GetLine(), fPosition, field);
    throw fTable->MakeNotAWeight(row.GetLine(), fPosition, field, found.value);
}
