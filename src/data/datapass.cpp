#include "data/datapass.h"

#include "base/bincancelmonitor.h"
#include "base/makestatus.h"
#include "data/passreports.h"
#include "data/recordfiles.h"
#include "metadata/recordlayout.h"

#include <mcobnqrt/binnumericusermissing.h>
#include <mcobnqrt/binroundencoder.h>
#include <mcobnqrt/binvarlist.h>
#include <mcobnqrt/ibinrecordsource.h>

#include <algorithm>
#include <cmath>
#include <cstdint>

using MCBinning::MCStatus;
using MCCommon::Record;
using MCMV::gMissingValue;

namespace
{

/// A code's whole part has to lie in 0..255 to fit the 8 bits of a tuple. The double is compared, before any cast: a
/// NaN or a number beyond an int fits no more than 256 does.
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

} // namespace

DataPass::DataPass(const BINVarList& list, const RecordLayout& layout, unsigned int maxNumRecords)
    : fVarList(list), fLayout(layout), fMaxCodes(list.Size(), 0), fUsable(list.Size(), true),
      fMaxNumRecords(maxNumRecords)
{
    for (int variable = 0; variable < fLayout.GetNumVariables(); ++variable)
        fUserMissingInfo.push_back(fVarList.GetVarAt(variable)->GetUserMissingInfo());
    if (fLayout.GetWeightVariable() >= 0)
        fWeightEncoder = static_cast<const BINRoundEncoder*>(fVarList.GetEncoderAt(fLayout.GetWeightVariable()));
}

MCStatus DataPass::Read(IBINRecordSource& source, RecordFiles& files, BINCancelMonitor& cancelMonitor,
                        PassReports& reports)
{
    Record processed(fLayout.GetNumPositions());
    std::uint64_t numReceived = 0;
    while (source.HasNext() && !cancelMonitor.IsCancelled())
    {
        if (const Record* record = source.Next())
        {
            ++numReceived;
            MCStatus status = ProcessRecord(*record, processed);
            if (!status.IsError() && !fSkipRecord)
                status = SpoolRecord(processed, files);
            if (status.IsError())
                return status; // a warning goes on: the position that it is about has dropped out
        }
        reports.CountTurn(numReceived);
    }
    return files.Flush();
}

MCStatus DataPass::SpoolRecord(const Record& processed, RecordFiles& files)
{
    if (fNumRecords == fMaxNumRecords)
        return MakeError(MCBinning::BINStatusOutOfMemory);
    const int numPositions = fLayout.GetNumPositions();
    for (int position = 0; position < numPositions; ++position)
    {
        if (fUsable[static_cast<std::size_t>(position)])
            files.Append(position, processed[position]);
    }
    if (files.IsFull())
    {
        const MCStatus status = files.Flush();
        if (status.IsError())
            return status;
    }
    ++fNumRecords;
    return MCStatus();
}

void DataPass::ExcludeUndeclaredCategories()
{
    for (int variable = 0; variable < fLayout.GetNumVariables(); ++variable)
    {
        const IBINVariable::MeasureLevel level = fLayout.GetMeasureLevel(variable);
        if (level != IBINVariable::MeasureNumericCategorical && level != IBINVariable::MeasureStringCategorical)
            continue;
        const auto position = static_cast<std::size_t>(fLayout.PositionOf(variable));
        if (fMaxCodes[position] >= fVarList.GetVarAt(variable)->GetNumberOfCategories())
            fUsable[position] = false;
    }
}

MCStatus DataPass::ProcessRecord(const Record& input, Record& processed)
{
    const int numPositions = fLayout.GetNumPositions();
    for (int position = 0; position < numPositions; ++position) processed[position] = 0.0;
    if (fWeightEncoder != nullptr)
    {
        const double weight = fWeightEncoder->Encode(input[fLayout.GetWeightVariable()]);
        fSkipRecord = weight == gMissingValue;
        if (fSkipRecord)
            return MCStatus();
        processed[fLayout.GetWeightPosition()] = weight;
    }

    MCStatus status;
    if (fLayout.GetTargetVariable() >= 0)
    {
        status = ProcessTarget(input[fLayout.GetTargetVariable()], processed);
        if (status.IsError())
            return status;
    }

    int position = fLayout.GetFirstAttributePosition();
    for (const int variable : fLayout.GetAttributes())
    {
        if (fLayout.GetMeasureLevel(variable) == IBINVariable::MeasureContinuous)
            processed[position] = ProcessContinuous(variable, input[variable]);
        else if (!ProcessCategory(input[variable], position, processed))
            status = AboutIndex(MakeWarning(MCBinning::BINStatusTooManyCategories), position);
        ++position;
    }
    return status;
}

/// With no other categorical variable in the list there is nothing left to bin against once the target is out.
MCStatus DataPass::ProcessTarget(double code, Record& processed)
{
    if (IsMissingTarget(code))
    {
        processed[0] = gMissingValue;
        return MCStatus();
    }
    if (StoreCode(code, 0, processed))
        return MCStatus();
    const bool isWarning = fVarList.GetNumCatVar() > 1;
    return AboutIndex(MCStatus(MCBinning::BINStatusTooManyCategories, isWarning), fLayout.GetTargetVariable());
}

/// A NaN has no place in the order of values, so it is missing.
double DataPass::ProcessContinuous(int variable, double value) const
{
    const IBINUserMissing* missing = fUserMissingInfo[static_cast<std::size_t>(variable)];
    const bool isUserMissing = missing != nullptr && missing->GetDataType() == IBINUserMissing::DataTypeNumeric &&
                               static_cast<const BINNumericUserMissing*>(missing)->Contains(value);
    return isUserMissing || std::isnan(value) ? gMissingValue : value;
}

/// \return false if this code made the position drop out.
bool DataPass::ProcessCategory(double code, int position, Record& processed)
{
    if (!IsMissingCategory(code))
        return StoreCode(code, position, processed);
    processed[position] = gMissingValue;
    return true;
}

/// Stores a code as it came, with its fraction. \return false if it doesn't fit, and then the position has dropped out.
/// A position that has dropped out stores nothing more and is not reported again.
bool DataPass::StoreCode(double code, int position, Record& processed)
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
