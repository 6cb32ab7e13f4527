#include "binning/efbinalgorithm.h"

#include "binning/attributereports.h"
#include "binning/binefpreprocess.h"

using MCBinning::MCStatus;
using MCMV::gMissingValue;

EFBINAlgorithm::EFBINAlgorithm(const EFBINSettings& settings, const BINVarList& varList, Platform* platform)
    : BinningDriver(settings, varList, platform)
{
}

EFBINAlgorithm::~EFBINAlgorithm() = default;

MCStatus EFBINAlgorithm::Run(IBINRecordSource* source, const std::vector<int>* attributes)
{
    fNumberOfBins = fSettings.GetNumberOfBins();
    if (fNumberOfBins <= 0)
        return MakeError(MCBinning::BINStatusBadNumberOfBins);
    if (attributes != nullptr && !CheckAttributeList(*attributes))
        return MakeError(MCBinning::BINStatusBadAttributeIndex);
    if (fCancelMonitor.IsCancelled())
        return CloseRun(MCStatus());

    constexpr unsigned int kNoThreshold = 0;
    const MCStatus status = PrepareOnce(source, TupleKind::kWithoutTarget, kNoThreshold);
    if (status.IsError())
        return status;
    return CloseRun(BinAllAttributes(attributes));
}

/// Gives each entry its verdict. \return whether some entry can be binned.
bool EFBINAlgorithm::CheckAttributeList(const std::vector<int>& attributes)
{
    fAttributeStatus.clear();
    for (const int attribute : attributes) fAttributeStatus.push_back(CheckAttribute(attribute));
    return IsAnyOK(fAttributeStatus);
}

MCStatus EFBINAlgorithm::CheckAttribute(int attribute) const
{
    if (!HasVariable(attribute))
        return MakeError(MCBinning::BINStatusBadAttributeIndex);
    return attribute == fWeightIndex ? MakeError(MCBinning::BINStatusRoleConflict) : MCStatus();
}

/// \return the status of the attribute treated last.
MCStatus EFBINAlgorithm::BinAllAttributes(const std::vector<int>* attributes)
{
    BINEFPreProcess preProcess(fNumberOfBins, fRightBorderClosed);
    const Lend lend(fPreProcess, preProcess);
    AttributeReports reports(fSettings, fPlatform);
    MCStatus status;
    const auto treat = [&](int attribute)
    {
        status = BinAttribute(attribute);
        reports.CountAttribute(attribute, status);
    };

    if (attributes == nullptr)
    {
        for (int attribute = 0; attribute < GetNumVariables(); ++attribute)
        {
            if (attribute != fWeightIndex)
                treat(attribute);
        }
        return status;
    }
    const std::vector<MCStatus> verdicts = fAttributeStatus; // a copy: a callback of the host may run the object again
    for (std::size_t entry = 0; entry < attributes->size(); ++entry)
    {
        const int attribute = (*attributes)[entry];
        if (verdicts[entry].IsOK())
            treat(attribute);
        else // where the store refuses the index, the entry leaves no trace
            fOutput.SetAttributeResults(verdicts[entry], {}, {}, attribute, 0, 0.0, 0.0, 0.0, 0.0);
    }
    return status;
}

MCStatus EFBINAlgorithm::BinAttribute(int attribute)
{
    if (fCancelMonitor.IsCancelled())
        return CloseStep(MCStatus());

    MCStatus status = fAttributeReader->GetAttributeData(attribute, &fTuples);
    if (status.IsError())
    {
        fOutput.SetAttributeResults(status, {}, {}, attribute, 0, 0.0, 0.0, gMissingValue, gMissingValue);
        return CloseStep(status);
    }
    const BINAttributeReader& reader = *fAttributeReader;
    fRecordCount = reader.GetNumTuples();
    std::vector<double> cuts;
    std::vector<double> counts;
    if (fRecordCount == 0)
        status = MakeWarning(MCBinning::BINStatusNoValidValues);
    else
    {
        fPreProcess->BinEqualFrequency(fTuples, fRecordCount, cuts, counts, reader.GetTotalWeight());
        if (cuts.empty())
            status = AboutIndex(MakeWarning(MCBinning::BINStatusNoEFCutPoints), attribute);
        if (reader.GetNumDistinct() == 1)
            status = AboutIndex(MakeWarning(MCBinning::BINStatusSingleValueAttribute), attribute);
    }
    fOutput.SetAttributeResults(status, cuts, counts, attribute, reader.GetNumDistinct(), reader.GetTotalWeight(),
                                reader.GetTotalWeightWithMissing(), reader.GetMinValue(), reader.GetMaxValue());
    return CloseStep(status);
}

void EFBINAlgorithm::Display(std::ostream& os)
{
    DisplayAs("EFBINAlgorithm", os);
}
