#ifndef MCOBNQRT_CREATEALGORITHM_H
#define MCOBNQRT_CREATEALGORITHM_H

#include "base/makestatus.h"
#include "metadata/recordlayout.h"

#include <mcobnqrt/binvarlist.h>
#include <mcobnqrt/mcstatus.h>

#include <memory>
#include <utility>
#include <vector>

/// Whether data can be prepared for the list. The status names a variable that is in the way, -1 if none is.
inline MCBinning::MCStatus CheckVarList(const BINVarList& varList)
{
    std::vector<int> oneCategory;
    std::vector<int> noCategories;
    const bool isValid = varList.IsValidList(oneCategory, noCategories);
    int culprit = -1;
    if (isValid)
        culprit = FindVariableWithoutPosition(varList);
    else if (!noCategories.empty())
        culprit = noCategories.front();
    else if (!oneCategory.empty())
        culprit = oneCategory.front();
    if (isValid && culprit < 0)
        return MCBinning::MCStatus();
    MCBinning::MCStatus status = MakeError(MCBinning::BINStatusInvalidVarList);
    status.SetDiscreteDatum(1, culprit);
    return status;
}

/// Does the work of both factories: makes an `Algorithm` on copies of the arguments and hands it to the caller, or
/// gives null and says why in `status`. The algorithm stands in `underConstruction` meanwhile.
template<class Algorithm, class Interface, class Settings>
Interface* CreateAlgorithm(const Settings& settings, const BINVarList& varList, MCBinning::MCStatus& status,
                           std::unique_ptr<Interface>& underConstruction)
{
    status = MCBinning::MCStatus(); // CheckVarList may throw, and the status of an earlier call must not stay then
    status = CheckVarList(varList);
    if (status.IsError())
        return nullptr;
    try
    {
        underConstruction = std::make_unique<Algorithm>(settings, varList);
    }
    catch (...) // bad_alloc, length_error, or whatever the program's own operator new throws: no host code runs above
    {
        status = MakeError(MCBinning::BINStatusOutOfMemory);
        return nullptr;
    }
    // The cancel query is the host's and may throw: the algorithm then goes with this scope.
    std::unique_ptr<Interface> algorithm = std::move(underConstruction);
    status = algorithm->GetStatus();
    return status.IsError() ? nullptr : algorithm.release();
}

#endif
