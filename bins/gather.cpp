#include "bins/gather.h"

#include <memory>
#include <utility>

using MCBinning::MCStatus;

namespace
{

/// The status with the index of a variable, where it has one, in the numbering of all variables.
MCStatus Renumber(MCStatus status, int attribute, int target)
{
    switch (status.GetErrorCode())
    {
    case MCBinning::BINStatusSingleValueAttribute:
    case MCBinning::BINStatusNoEFCutPoints:
    case MCBinning::BINStatusSingleCategoryTarget:
    case MCBinning::BINStatusTooManyCategories:
        status.SetDiscreteDatum(0, status.GetDiscreteDatum(0) == 0 ? attribute : target);
        break;
    default: // tells of no variable
        break;
    }
    return status;
}

std::shared_ptr<const Variable> GetVariable(const Bins& bins, int index)
{
    return index < 0 ? nullptr : bins.variables.at(static_cast<std::size_t>(index));
}

} // namespace

void AddPart(Bins& whole, const Bins& part, int attribute, int target, std::optional<std::int64_t> numDistinct)
{
    whole.componentVersion = part.componentVersion;
    // A failure stays, and a flag says no more than that some result has a status.
    if (!whole.status.IsError() && !part.status.IsOK())
        whole.status = Renumber(part.status, attribute, target);
    for (AttributeBins result : part.results)
    {
        result.attribute = GetVariable(whole, attribute);
        result.target = GetVariable(whole, target);
        result.status = Renumber(result.status, attribute, target);
        if (numDistinct)
            result.numDistinct = numDistinct;
        whole.results.push_back(std::move(result));
    }
}
