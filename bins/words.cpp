#include "bins/words.h"

#include <mcobnqrt/mcstatus.h>

namespace
{

// Without a default, so that the compiler tells of a code that has no words.
const char* GetWords(MCBinning::BINStatusCode code)
{
    switch (code)
    {
    case MCBinning::BINStatusCancelled:
        return "cancelled";
    case MCBinning::BINStatusOutOfMemory:
        return "out of memory";
    case MCBinning::BINStatusTempDirNotFound:
        return "the directory for temporary files does not exist, or no file can be made in it";
    case MCBinning::BINStatusBadBinTable:
        return "the values lie outside all bins";
    case MCBinning::BINStatusInvalidVarList:
        return "these variables cannot be analysed: there is no attribute, or one has fewer than 2 categories or no "
               "role";
    case MCBinning::BINStatusNoRecords:
        return "there is no record of positive weight";
    case MCBinning::BINStatusRoleConflict:
        return "the variable is the target or the weight, or attribute and target at once";
    case MCBinning::BINStatusTargetNotCategorical:
        return "the target is not categorical";
    case MCBinning::BINStatusNoValidPairs:
        return "there is no pair of an attribute and a target that can be binned";
    case MCBinning::BINStatusBadNumberOfBins:
        return "the number of bins is not set";
    case MCBinning::BINStatusTargetUnusable:
        return "there is no target, or its categories cannot be used";
    case MCBinning::BINStatusBadAttributeIndex:
        return "there is no such attribute";
    case MCBinning::BINStatusTooManyCategories:
        return "the variable has more than 256 categories";
    case MCBinning::BINStatusIndexOutOfRange:
        return "there is no such variable or result";
    case MCBinning::BINStatusSingleValueAttribute:
        return "all valid values are equal";
    case MCBinning::BINStatusNoValidValues:
        return "no record has a valid value";
    case MCBinning::BINStatusSingleCategoryTarget:
        return "the records with a valid value have a single category of the target";
    case MCBinning::BINStatusNoCutPoints:
        return "no cut point separates the categories of the target well enough";
    case MCBinning::BINStatusSomeResultsFlagged:
        return "some results carry a warning or an error";
    case MCBinning::BINStatusNoEFCutPoints:
        return "no cut point was found: too few different values for the number of bins";
    case MCBinning::BINStatusNoResults:
        return "there are no results";
    case MCBinning::BINStatusCannotOpenTempFile:
        return "a temporary file cannot be opened, written or read; the disk may be full";
    }
    return "a status that this release does not know";
}

} // namespace

const char* GetStatusWords(const MCBinning::MCStatus& status)
{
    return status.IsOK() ? "OK" : GetWords(static_cast<MCBinning::BINStatusCode>(status.GetErrorCode()));
}

const char* GetSeverity(const MCBinning::MCStatus& status)
{
    if (status.IsOK())
        return "ok";
    return status.IsError() ? "error" : "warning";
}

std::string DescribeStatus(const MCBinning::MCStatus& status)
{
    if (status.IsOK())
        return "OK";
    return GetSeverity(status) + (" " + std::to_string(status.GetErrorCode())) + ": " + GetStatusWords(status);
}
