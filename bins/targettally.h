#ifndef MCOBNQRT_BINS_TARGETTALLY_H
#define MCOBNQRT_BINS_TARGETTALLY_H

#include "bins/bins.h"
#include "bins/categorytally.h"

#include <mcobnqrt/ibinrecordsource.h>

#include <cstddef>
#include <memory>
#include <optional>
#include <vector>

/// Hands the records of another source on, and adds up what the library does not tell of them. What the bins of an
/// attribute lack of the weights of the targets' categories are the records without a value: as all sums of weights on
/// a grid are exact, so is the difference.
class TargetTally : public IBINRecordSource
{
public:
    /// \param records stays the caller's.
    /// \param pairs what will be binned.
    TargetTally(IBINRecordSource& records, const std::vector<std::shared_ptr<const Variable>>& variables,
                const std::vector<CategoryTally::Pair>& pairs);

    bool HasNext() override { return fRecords.HasNext(); }
    const MCCommon::Record* Next() override;

    /// What the bins of a result lack, once all records have passed; nothing if the result has no bins.
    std::optional<Bin> FindMissing(const AttributeBins& bins) const;

    /// What each category of the attribute of a result holds, once all records have passed; empty if the attribute is
    /// not categorical or the result has no bins.
    std::vector<Bin> FindCategories(const AttributeBins& bins) const;

private:
    struct Target
    {
        const Variable* variable;
        int index;
        std::vector<double> weights; ///< by code
    };

    int FindIndex(const Variable* variable) const;

    IBINRecordSource& fRecords;
    const std::vector<std::shared_ptr<const Variable>>& fVariables;
    std::optional<int> fWeight; ///< the index of the weight
    std::vector<Target> fTargets;
    CategoryTally fCategories;
};

#endif
