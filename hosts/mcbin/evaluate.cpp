#include "hosts/mcbin/evaluate.h"

#include "bins/binner.h"
#include "bins/cutrounding.h"
#include "bins/run.h"
#include "bins/text.h"
#include "hosts/mcbin/cutpoints.h"
#include "hosts/mcbin/failure.h"
#include "hosts/mcbin/input/jsoninput.h"
#include "hosts/mcbin/input/rowweights.h"
#include "hosts/mcbin/input/tablereader.h"
#include "hosts/mcbin/interrupt.h"
#include "hosts/mcbin/options.h"
#include "hosts/mcbin/progress.h"

#include <algorithm>
#include <deque>
#include <map>
#include <memory>
#include <utility>

namespace
{

bool HasColumn(const TableReader& table, const std::string& name)
{
    const std::vector<std::string>& names = table.GetColumnNames();
    return std::find(names.begin(), names.end(), name) != names.end();
}

/// Finds the categories of a target.
class TargetColumn
{
public:
    TargetColumn(std::shared_ptr<const Variable> target, std::size_t position,
                 const std::vector<std::string>& missingTexts, const NumberForm& numbers)
        : fPosition(position)
    {
        fBins.attribute = std::move(target);
        fBinner.emplace(fBins, missingTexts, numbers);
    }

    /// Reads the field of the next row. \return false if it is a category that is not known.
    bool Read(const CsvRow& row)
    {
        const Binner::Found found = fBinner->Find(row[fPosition]);
        fCode = found.bin ? std::optional(static_cast<std::size_t>(found.value)) : std::nullopt;
        return !found.isBad;
    }

    const std::optional<std::size_t>& GetCode() const { return fCode; }

private:
    std::size_t fPosition;
    AttributeBins fBins;
    std::optional<Binner> fBinner;
    std::optional<std::size_t> fCode;
};

/// Counts one attribute.
struct CountedColumn
{
    std::size_t position;
    const Variable* attribute;
    Binner binner;
    BinTally tally;
    TargetColumn* target; ///< null without one
};

class Evaluator
{
public:
    Evaluator(TableReader& table, Bins first, const EvaluateOptions& options)
        : fTable(table), fOptions(options), fMissingTexts(first.missingTexts)
    {
        fEvaluated.evaluation = BeginEvaluation(std::move(first));
        fEvaluated.notes = table.GetNotes();
        const std::vector<std::string>& further = options.columns.missingText;
        fMissingTexts.insert(fMissingTexts.end(), further.begin(), further.end());
        for (std::size_t i = 0; i < GetFirst().results.size(); ++i)
        {
            if (GetFirst().results[i].HasBins())
                AddColumn(i);
        }
        if (fColumns.empty())
            throw Failure("there is nothing to evaluate, as no attribute has bins");
    }

    Evaluated Run(Progress& progress)
    {
        RowWeights weights = MakeWeights(progress);
        progress.BeginRows("counting the records");
        while (const CsvRow* const row = fTable.NextRow())
        {
            progress.CountRow();
            ++fNumRecords;
            if (const std::optional<double> weight = weights.Get(*row))
                CountRow(*row, *weight);
            else
                ++fNumWithoutWeight;
        }
        ThrowIfInterrupted(); // the signal may have ended what writes the table, and come a moment later
        progress.Erase();
        Collect(weights);
        return std::move(fEvaluated);
    }

private:
    const Bins& GetFirst() const { return fEvaluated.evaluation.first; }
    Bins& GetSecond() { return fEvaluated.evaluation.second; }

    void AddColumn(std::size_t index)
    {
        const AttributeBins& bins = GetFirst().results[index];
        TargetColumn* const target = FindTarget(bins.target);
        fColumns.push_back({fTable.FindColumn(bins.attribute->name), bins.attribute.get(),
                            Binner(bins, fMissingTexts, fTable.GetNumberForm()), BinTally(bins, target != nullptr),
                            target});
        fEvaluated.evaluation.indices.push_back(index);
    }

    /// Null without a target in the bins, or where the table lacks it and it was not asked for.
    TargetColumn* FindTarget(const std::shared_ptr<const Variable>& target)
    {
        if (!target)
            return nullptr;
        const auto found = fTargetOf.find(target.get());
        if (found != fTargetOf.end())
            return found->second;
        TargetColumn*& column = fTargetOf[target.get()];
        if (!fOptions.columns.target.empty() && fTargetOf.size() > 1)
            throw Failure("--target names one column, and the bins have several targets");
        const std::string& name = fOptions.columns.target.empty() ? target->name : fOptions.columns.target;
        if (fOptions.columns.target.empty() && !HasColumn(fTable, name))
            return nullptr;
        column = &fTargets.emplace_back(target, fTable.FindColumn(name), fMissingTexts, fTable.GetNumberForm());
        return column;
    }

    /// Tells the variables of the second population what its weight is, if it has one.
    RowWeights MakeWeights(Progress& progress)
    {
        std::vector<std::shared_ptr<const Variable>>& variables = GetSecond().variables;
        auto position = std::find_if(variables.begin(), variables.end(),
                                     [](const auto& variable) { return variable->role == VariableRole::kWeight; });
        if (position == variables.end() && fOptions.columns.weight.empty())
            return {};
        if (position == variables.end())
            position = variables.insert(position, MakeUnknownWeight());
        Variable weight = **position;
        if (!fOptions.columns.weight.empty())
            weight.name = fOptions.columns.weight;
        else if (!HasColumn(fTable, weight.name))
        {
            fEvaluated.notes.push_back("there is no column " + Quote(weight.name) +
                                       ", the weight of the bins, so each row weighs 1");
            variables.erase(position);
            return {};
        }
        *position = std::make_shared<const Variable>(weight);
        GetSecond().numRecordsWithoutWeight = 0;
        return {fTable, weight, fMissingTexts, fOptions.columns.isBadMissing, progress};
    }

    /// Of bins that had none.
    std::shared_ptr<const Variable> MakeUnknownWeight() const
    {
        auto weight = std::make_shared<Variable>();
        weight->kind = VariableKind::kWeight;
        weight->role = VariableRole::kWeight;
        weight->rounding = fOptions.columns.rounding;
        weight->isScaledToRecords = fOptions.columns.isWeightScaled;
        return weight;
    }

    void CountRow(const CsvRow& row, double weight)
    {
        if (!(weight > 0.0))
            return;
        for (TargetColumn& target : fTargets)
        {
            if (!target.Read(row))
                fEvaluated.evaluation.weightOfUnseenTargets += weight;
        }
        for (CountedColumn& column : fColumns)
        {
            const Binner::Found found = Find(row, column);
            column.tally.Add(found, column.target ? column.target->GetCode() : std::nullopt, weight);
        }
    }

    Binner::Found Find(const CsvRow& row, CountedColumn& column)
    {
        const std::string_view field = row[column.position];
        const Binner::Found found = column.binner.Find(field);
        if (!found.isBad)
            return found;
        if (column.attribute->IsCategorical())
        {
            column.tally.NameUnseen(field);
            return found;
        }
        if (!fOptions.columns.isBadMissing)
            throw fTable.MakeNotANumber(row.GetLine(), column.position, field);
        return {};
    }

    void Collect(const RowWeights& weights)
    {
        Bins& second = GetSecond();
        second.missingTexts = fMissingTexts;
        second.dataName = fTable.GetName();
        second.numRecords = fNumRecords;
        if (second.numRecordsWithoutWeight)
            second.numRecordsWithoutWeight = fNumWithoutWeight;
        SetWeightGrid(second, weights.GetStep());
        for (const CountedColumn& column : fColumns)
        {
            second.results.push_back(column.tally.GetBins());
            fEvaluated.evaluation.strangers.push_back(column.tally.GetStrangers());
            fEvaluated.evaluation.ranges.push_back(column.tally.GetRanges());
        }
    }

    TableReader& fTable;
    const EvaluateOptions& fOptions;
    std::vector<std::string> fMissingTexts;
    Evaluated fEvaluated;
    std::deque<TargetColumn> fTargets; ///< stay where they are
    std::map<const Variable*, TargetColumn*> fTargetOf;
    std::deque<CountedColumn> fColumns;
    std::int64_t fNumRecords = 0;
    std::int64_t fNumWithoutWeight = 0;
};

} // namespace

Evaluated EvaluateBins(const EvaluateOptions& options, Progress& progress)
{
    TableOptions tableOptions = options.table;
    tableOptions.isReadTwice = true;
    tableOptions.spoolDirectory = options.tempDirectory;
    if (!options.bins.empty())
    {
        Bins bins = ReadJson(options.bins, Edits::kRecut);
        TableReader table(tableOptions);
        return Evaluator(table, std::move(bins), options).Run(progress);
    }
    TableReader table(tableOptions);
    Bins bins = MakeBinsOfCutPoints(table, options, progress);
    return Evaluator(table, std::move(bins), options).Run(progress);
}

Bins RoundCutPoints(TableReader& table, Bins bins, const BinOptions& options, Progress& progress)
{
    const auto hasBins = [](const AttributeBins& result) { return result.HasBins(); };
    if (std::none_of(bins.results.begin(), bins.results.end(), hasBins))
        return bins;
    table.Rewind();
    EvaluateOptions counting;
    counting.columns.isBadMissing = options.columns.isBadMissing;
    return RoundCutPoints(Evaluator(table, std::move(bins), counting).Run(progress).evaluation);
}
