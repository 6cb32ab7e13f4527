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
    const int numberOfBins = fSettings.GetNumberOfBins();
    if (numberOfBins <= 0)
        return MakeError(MCBinning::BINStatusBadNumberOfBins);
    const std::vector<Entry> entries = attributes != nullptr ? CheckAttributeList(*attributes) : ListAll();
    if (attributes != nullptr && !IsAnyOK(entries))
        return MakeError(MCBinning::BINStatusBadAttributeIndex);
    if (fCancelMonitor.IsCancelled())
        return CloseRun(MCStatus());

    constexpr unsigned int kNoThreshold = 0;
    const MCStatus status = PrepareOnce(source, TupleKind::kWithoutTarget, kNoThreshold);
    if (status.IsError())
        return status;
    return CloseRun(BinAllEntries(entries, numberOfBins));
}

/// Every variable but the weight.
std::vector<EFBINAlgorithm::Entry> EFBINAlgorithm::ListAll() const
{
    std::vector<Entry> entries;
    for (int attribute = 0; attribute < GetNumVariables(); ++attribute)
    {
        if (attribute != fWeightIndex)
            entries.push_back({attribute, MCStatus()});
    }
    return entries;
}

/// Gives each entry of the host's list its verdict.
std::vector<EFBINAlgorithm::Entry> EFBINAlgorithm::CheckAttributeList(const std::vector<int>& attributes) const
{
    std::vector<Entry> entries;
    entries.reserve(attributes.size());
    for (const int attribute : attributes) entries.push_back({attribute, CheckAttribute(attribute)});
    return entries;
}

MCStatus EFBINAlgorithm::CheckAttribute(int attribute) const
{
    if (!HasVariable(attribute))
        return MakeError(MCBinning::BINStatusBadAttributeIndex);
    return attribute == fWeightIndex ? MakeError(MCBinning::BINStatusRoleConflict) : MCStatus();
}

/// \return the status of the attribute treated last.
MCStatus EFBINAlgorithm::BinAllEntries(const std::vector<Entry>& entries, int numberOfBins)
{
    const BINEFPreProcess preProcess(numberOfBins, fRightBorderClosed);
    AttributeReports reports(fSettings, fPlatform);
    MCStatus status;
    for (const Entry& entry : entries)
    {
        if (entry.fVerdict.IsOK())
        {
            status = BinAttribute(entry.fAttribute, preProcess);
            reports.CountAttribute(entry.fAttribute, status);
        }
        else // where the store refuses the index, the entry leaves no trace
            fOutput.SetAttributeResults(entry.fVerdict, {}, {}, entry.fAttribute, 0, 0.0, 0.0, 0.0, 0.0);
    }
    return status;
}

MCStatus EFBINAlgorithm::BinAttribute(int attribute, const BINEFPreProcess& preProcess)
{
    if (fCancelMonitor.IsCancelled())
        return CloseStep(MCStatus());

    std::vector<BINValueTuple>* tuples = nullptr; // the reader's
    MCStatus status = fAttributeReader->GetAttributeData(attribute, &tuples);
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
        preProcess.BinEqualFrequency(tuples, fRecordCount, cuts, counts, reader.GetTotalWeight());
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
