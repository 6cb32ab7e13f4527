#include "hosts/python/src/counting.h"

#include "bins/lookup.h"
#include "bins/run.h"
#include "hosts/python/src/libraryblocks.h"

#include <mcobnqrt/mccommon.h>

#include <cmath>
#include <set>
#include <utility>

namespace
{

/// Where the value of a field belongs; a category that the bins were made without has a code behind all others.
Binner::Found Find(const AttributeBins& bins, const Field& field, double value)
{
    const bool isCode = field.use != Field::Use::kAttribute;
    if (isCode ? value < 0.0 : value == MCMV::gMissingValue || std::isnan(value))
        return {};
    if (isCode && value >= static_cast<double>(field.GetNumCategories()))
        return {std::nullopt, true, 0.0};
    if (!isCode && field.HasMissingNumbers() && field.missingNumbers.Contains(value))
        return {};
    return {FindBin(bins.cutPoints, bins.isRightClosed, value), false, value};
}

class Counter
{
public:
    Counter(Bins first, const std::vector<Counted>& counted, const std::vector<Field>& fields, WeightGrid grid,
            bool areGroups)
        : fCounted(counted), fFields(fields), fWeight(FindWeight(fields)), fGrid(grid), fAreGroups(areGroups),
          fEvaluation(BeginEvaluation(std::move(first)))
    {
        for (const Counted& one : fCounted)
        {
            fTallies.emplace_back(fEvaluation.first.results.at(one.result), one.target.has_value());
            fEvaluation.indices.push_back(one.result);
            if (one.target)
                fTargets.insert(*one.target);
        }
    }

    void Add(const Block& block)
    {
        for (std::size_t row = 0; row < block.numRows; ++row)
        {
            ++fNumRecords;
            const double weight = GetWeight(block, row);
            if (weight > 0.0)
                AddRecord(block, row, weight);
            else if (fAreGroups)
                Widen(block, row);
        }
    }

    Evaluation Finish()
    {
        Bins& second = fEvaluation.second;
        second.numRecords = fNumRecords;
        if (fWeight)
            second.numRecordsWithoutWeight = fNumWithoutWeight;
        SetWeightGrid(second, fWeight ? fGrid.GetStep() : std::nullopt);
        for (std::size_t i = 0; i < fTallies.size(); ++i)
        {
            for (const std::string& name : fFields[fCounted[i].attribute].unseenNames) fTallies[i].NameUnseen(name);
            second.results.push_back(fTallies[i].GetBins());
            fEvaluation.strangers.push_back(fTallies[i].GetStrangers());
            fEvaluation.ranges.push_back(fTallies[i].GetRanges());
        }
        return std::move(fEvaluation);
    }

private:
    /// 0 where it is missing.
    double GetWeight(const Block& block, std::size_t row)
    {
        if (!fWeight)
            return 1.0;
        const double weight = block.At(*fWeight, row);
        if (weight != MCMV::gMissingValue)
            return fGrid.Round(weight);
        ++fNumWithoutWeight;
        return 0.0;
    }

    void AddRecord(const Block& block, std::size_t row, double weight)
    {
        for (const std::size_t target : fTargets)
        {
            if (block.At(target, row) >= static_cast<double>(fFields[target].GetNumCategories()))
                fEvaluation.weightOfUnseenTargets += weight;
        }
        for (std::size_t i = 0; i < fTallies.size(); ++i)
        {
            const Counted& counted = fCounted[i];
            const AttributeBins& bins = fEvaluation.GetFirst(i);
            fTallies[i].Add(Find(bins, fFields[counted.attribute], block.At(counted.attribute, row)),
                            GetCode(block, row, counted.target), weight);
        }
    }

    /// Of a group that was counted already.
    void Widen(const Block& block, std::size_t row)
    {
        for (std::size_t i = 0; i < fTallies.size(); ++i)
        {
            const Counted& counted = fCounted[i];
            const Binner::Found found =
                Find(fEvaluation.GetFirst(i), fFields[counted.attribute], block.At(counted.attribute, row));
            fTallies[i].Widen(found, GetCode(block, row, counted.target));
        }
    }

    std::optional<std::size_t> GetCode(const Block& block, std::size_t row, std::optional<std::size_t> target) const
    {
        const double code = target ? block.At(*target, row) : -1.0;
        const bool isKnown = code >= 0.0 && code < static_cast<double>(fFields[*target].GetNumCategories());
        return isKnown ? std::optional(static_cast<std::size_t>(code)) : std::nullopt;
    }

    const std::vector<Counted>& fCounted;
    const std::vector<Field>& fFields;
    std::optional<std::size_t> fWeight;
    WeightGrid fGrid;
    bool fAreGroups;
    Evaluation fEvaluation;
    std::vector<BinTally> fTallies; ///< by element of fCounted
    std::set<std::size_t> fTargets;
    std::int64_t fNumRecords = 0;
    std::int64_t fNumWithoutWeight = 0;
};

} // namespace

Evaluation CountRecords(Bins first, const std::vector<Counted>& counted, BlockSource& source,
                        const std::vector<Field>& fields, WeightGrid grid, bool areGroups)
{
    Counter counter(std::move(first), counted, fields, grid, areGroups);
    Block block(fields.size());
    while (source.Next(block)) counter.Add(block);
    return counter.Finish();
}
