#ifndef MCOBNQRT_TESTS_FUZZ_RECOUNT_H
#define MCOBNQRT_TESTS_FUZZ_RECOUNT_H

#include <mcobnqrt/mcobnqrt.h>

#include <vector>

/// The data of a run as its host knows them.
struct HostData
{
    BINVarList list; ///< as the factory got it
    IBINVariable::BINWRoundingOption rounding = IBINVariable::RoundClosest;
    std::vector<std::vector<double>> records; ///< an empty one is a turn without a record
    bool isRightClosed = true;                ///< when the records were read
    int distinctThreshold = 0;                ///< of a supervised run
};

/// Counts the records again, plainly, by the cut points of the result, and ends the process where the result says
/// something else than the records do.
void CheckResult(const HostData& data, const BINAttributeTargetResults& result);
void CheckResult(const HostData& data, const BINAttributeResults& result);

#endif
