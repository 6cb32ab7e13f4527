// The one pass over the host's records: which records count, what counts as missing, and which positions stay usable.
//
// Only a missing weight drops a record. All other missing data stay in the files as gMissingValue, since a record
// without one attribute is good for the others.

#include "base/bincancelmonitor.h"
#include "base/makestatus.h"
#include "data/bindatapreparator.h"

#include <mcobnqrt/binnumericusermissing.h>
#include <mcobnqrt/binprogressreporter.h>
#include <mcobnqrt/binroundencoder.h>
#include <mcobnqrt/binvarlist.h>
#include <mcobnqrt/ibinrecordsource.h>
#include <mcobnqrt/progresslistener.h>

#include <algorithm>
#include <cmath>
#include <cstdint>
#include <limits>

using MCBinning::MCStatus;
using MCCommon::Record;
using MCMV::gMissingValue;

namespace
{

/// A code's whole part has to lie in 0..255 to fit the 8 bits of a tuple. Asked of the double, before any cast: a NaN
/// or a number beyond an int fits no more than 256 does.
bool FitsCode(double code)
{
    return code > -1.0 && code < 256.0;
}

/// -1 marks a missing category. In a target it is the whole part that counts, as for every other code of a target.
bool IsMissingTarget(double code)
{
    return code == gMissingValue || (code > -2.0 && code <= -1.0);
}

bool IsMissingCategory(double code)
{
    return code == gMissingValue || code == -1.0;
}

/// The reports of the pass: one for every `interval` turns of its loop, none for an interval of 0 or without a
/// listener.
class PassReports
{
public:
    PassReports(ProgressListener* listener, int interval, Platform* platform)
        : fListener(listener), fInterval(interval), fCountdown(interval), fPlatform(platform),
          fStart(platform->GetTickCount())
    {
    }

    /// A number of records beyond an int is reported as the largest one.
    void CountTurn(std::uint64_t numReceived)
    {
        if (fListener == nullptr || --fCountdown != 0)
            return;
        const std::uint64_t largest = std::numeric_limits<int>::max();
        fReporter.SetValues(static_cast<unsigned int>(std::min(numReceived, largest)),
                            fPlatform->GetSecondsSince(fStart));
        fListener->ReportProgress(fReporter);
        fCountdown = fInterval;
    }

private:
    ProgressListener* fListener;
    int fInterval;
    std::int64_t fCountdown; ///< falls below 0, and ever on, with an interval of 0
    Platform* fPlatform;
    std::int64_t fStart;
    BINProgressReporter fReporter;
};

} // namespace

MCStatus BINDataPreparator::PrepareData(IBINRecordSource* source)
{
    fStatus = InitTempFiles();
    if (!fStatus.IsOK())
        return fStatus;
    MCStatus status = ReadSource(source);
    if (!status.IsError())
        status = FlushBuffer();
    if (status.IsError())
        return status;

    if (fNumRecords == 0)
        fStatus = MakeError(MCBinning::BINStatusNoRecords);
    else if (fCancelMonitor->IsCancelled())
        fStatus = MakeError(MCBinning::BINStatusCancelled);
    else
        ExcludeUndeclaredCategories();
    return fStatus;
}

MCStatus BINDataPreparator::ReadSource(IBINRecordSource* source)
{
    PassReports reports(fProgressListener, fNSkippedCasesReports, fPlatform);
    Record processed(static_cast<int>(fProcRecSize));
    std::uint64_t numReceived = 0;
    while (source->HasNext() && !fCancelMonitor->IsCancelled())
    {
        if (const Record* record = source->Next())
        {
            ++numReceived;
            MCStatus status = ProcessRecord(*record, processed);
            if (!status.IsError() && !fSkipRecord)
                status = SpoolRecord(processed);
            if (status.IsError())
                return status; // a warning goes on: the position that it is about has dropped out
            fSkipRecord = false;
        }
        reports.CountTurn(numReceived);
    }
    return MCStatus();
}

MCStatus BINDataPreparator::SpoolRecord(const Record& processed)
{
    if (fNumRecords == fMaxNumRecords)
        return MakeError(MCBinning::BINStatusOutOfMemory);
    for (int position = 0; position < static_cast<int>(fProcRecSize); ++position)
    {
        if (fUsable[static_cast<std::size_t>(position)])
            fBuffer.Append(position, processed[position]);
    }
    if (fBuffer.IsFull())
    {
        const MCStatus status = FlushBuffer();
        if (status.IsError())
            return status;
    }
    ++fNumRecords;
    return MCStatus();
}

/// A code at or beyond the declared number of categories makes a variable unusable, though its file is complete.
void BINDataPreparator::ExcludeUndeclaredCategories()
{
    for (std::size_t variable = 0; variable < fMeasureLevels.size(); ++variable)
    {
        const IBINVariable::MeasureLevel level = fMeasureLevels[variable];
        if (level != IBINVariable::MeasureNumericCategorical && level != IBINVariable::MeasureStringCategorical)
            continue;
        const auto position = static_cast<std::size_t>(fVariableIndex[variable]);
        if (fMaxCodes[position] >= fVarList->GetVarAt(static_cast<int>(variable))->GetNumberOfCategories())
            fUsable[position] = false;
    }
}

MCStatus BINDataPreparator::ProcessRecord(const Record& input, Record& processed)
{
    for (int position = 0; position < static_cast<int>(fProcRecSize); ++position) processed[position] = 0.0;
    if (fWeightNewIndex > 0)
    {
        const double weight = static_cast<const BINRoundEncoder*>(fWeightEncoder)->Encode(input[fWeightIndex]);
        fSkipRecord = weight == gMissingValue;
        if (fSkipRecord)
            return MCStatus();
        processed[fHasTarget] = weight;
    }

    MCStatus status;
    if (fTargetIndex >= 0)
    {
        status = ProcessTarget(input[fTargetIndex], processed);
        if (status.IsError())
            return status;
    }

    int position = fHasTarget + fHasWeight;
    for (const int variable : fInputIndices)
    {
        if (fMeasureLevels[static_cast<std::size_t>(variable)] == IBINVariable::MeasureContinuous)
            processed[position] = ProcessContinuous(variable, input[variable]);
        else if (!ProcessCategory(input[variable], position, processed))
            status = AboutIndex(MakeWarning(MCBinning::BINStatusTooManyCategories), position);
        ++position;
    }
    return status;
}

/// With no other categorical variable in the list there is nothing left to bin against once the target is out.
MCStatus BINDataPreparator::ProcessTarget(double code, Record& processed)
{
    if (IsMissingTarget(code))
    {
        processed[0] = gMissingValue;
        return MCStatus();
    }
    if (StoreCode(code, 0, processed))
        return MCStatus();
    const bool isWarning = fVarList->GetNumCatVar() > 1;
    return AboutIndex(MCStatus(MCBinning::BINStatusTooManyCategories, isWarning), fTargetIndex);
}

/// A NaN has no place in the order of values, so it is missing.
double BINDataPreparator::ProcessContinuous(int variable, double value) const
{
    const IBINUserMissing* missing = fUserMissingInfo[static_cast<std::size_t>(variable)];
    const bool isUserMissing = missing != nullptr && missing->GetDataType() == IBINUserMissing::DataTypeNumeric &&
                               static_cast<const BINNumericUserMissing*>(missing)->Contains(value);
    return isUserMissing || std::isnan(value) ? gMissingValue : value;
}

/// \return false if this code made the position drop out.
bool BINDataPreparator::ProcessCategory(double code, int position, Record& processed)
{
    if (!IsMissingCategory(code))
        return StoreCode(code, position, processed);
    processed[position] = gMissingValue;
    return true;
}

/// Stores a code as it came, with its fraction. \return false if it doesn't fit, and then the position has dropped out.
/// A position that is out already takes nothing, and nothing is said of it again.
bool BINDataPreparator::StoreCode(double code, int position, Record& processed)
{
    const auto index = static_cast<std::size_t>(position);
    if (!fUsable[index])
        return true;
    fUsable[index] = FitsCode(code);
    if (!fUsable[index])
        return false;
    processed[position] = code;
    fMaxCodes[index] = std::max(fMaxCodes[index], static_cast<int>(code));
    return true;
}
