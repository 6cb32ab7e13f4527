#include "hosts/mcbin/run.h"

#include "bins/words.h"
#include "hosts/mcbin/collect.h"
#include "hosts/mcbin/failure.h"
#include "hosts/mcbin/input/columnplan.h"
#include "hosts/mcbin/input/recordsource.h"
#include "hosts/mcbin/input/tableprofile.h"
#include "hosts/mcbin/input/variables.h"
#include "hosts/mcbin/interrupt.h"
#include "hosts/mcbin/notes.h"
#include "hosts/mcbin/progress.h"

#include <mcobnqrt/mcobnqrt.h>

#include <memory>

namespace
{

constexpr int kRecordsBetweenReports = 50000;

template<class Settings>
void SetShared(Settings& settings, const SettingOptions& options, Progress& progress, InterruptQuery& query)
{
    settings.SetNumberOfBins(options.bins);
    settings.SetRightBorderClosed(options.isRightClosed);
    settings.SetProgressListener(&progress);
    settings.SetNSkippedCasesReports(kRecordsBetweenReports);
    settings.SetCancelPointer(&query);
    if (!options.tempDirectory.empty())
        settings.SetTempDirName(options.tempDirectory);
}

/// A cancelled run is no failure: it may have found something.
void ThrowIfFailed(const MCBinning::MCStatus& status)
{
    if (status.IsError() && status.GetErrorCode() != MCBinning::BINStatusCancelled)
        throw Failure(DescribeStatus(status));
}

/// Takes the results of a run over the records of `source` that ended with `status`.
template<class Result, class Algorithm>
void Collect(Findings& findings, const MCBinning::MCStatus& status, Algorithm& algorithm,
             const TableRecordSource& source)
{
    findings.status = status;
    findings.componentVersion = algorithm.GetVersionString();
    std::vector<Result> results;
    algorithm.GetOutput()->GetAllCutPoints(results); // refuses if there are none, and none is what there is then
    if (results.empty() && status.IsError())
        throw Interrupted();
    AddWeightGrid(findings, source.GetWeightGrid());
    for (const Result& result : results) AddResult(findings, result, source.GetValues());
}

void RunSupervised(Findings& findings, Variables& variables, TableRecordSource& source, const SettingOptions& options,
                   Progress& progress)
{
    InterruptQuery query;
    BINSettings settings;
    SetShared(settings, options, progress, query);
    settings.SetSmallBinDetectionThreshold(options.smallBins);
    if (options.distinctThreshold >= 0)
        settings.SetNumDistinctValueThreshold(options.distinctThreshold);
    BINFactory factory;
    const std::unique_ptr<IBINAlgorithm> algorithm(factory.CreateBINAlgorithm(settings, variables.list));
    if (!algorithm && IsInterrupted())
        throw Interrupted();
    ThrowIfFailed(factory.GetStatus());
    const bool hasPairs = !variables.pairAttributes.empty();
    const MCBinning::MCStatus status = algorithm->Run(&source, hasPairs ? &variables.pairAttributes : nullptr,
                                                      hasPairs ? &variables.pairTargets : nullptr);
    ThrowIfFailed(status);
    Collect<BINAttributeTargetResults>(findings, status, *algorithm, source);
}

void RunEqualFrequency(Findings& findings, Variables& variables, TableRecordSource& source,
                       const SettingOptions& options, Progress& progress)
{
    InterruptQuery query;
    EFBINSettings settings;
    SetShared(settings, options, progress, query);
    EFBINFactory factory;
    const std::unique_ptr<IEFBINAlgorithm> algorithm(factory.CreateEFBINAlgorithm(settings, variables.list));
    if (!algorithm && IsInterrupted())
        throw Interrupted();
    ThrowIfFailed(factory.GetStatus());
    const MCBinning::MCStatus status = algorithm->Run(&source, nullptr);
    ThrowIfFailed(status);
    Collect<BINAttributeResults>(findings, status, *algorithm, source);
}

void Announce(Progress& progress, const Variables& variables)
{
    std::vector<std::string> names;
    for (unsigned int i = 0; i < variables.list.Size(); ++i)
        names.push_back(variables.list.GetVarAt(static_cast<int>(i))->GetVariableName());
    progress.SetNames(std::move(names));
    progress.ExpectAttributes(variables.pairAttributes.empty()
                                  ? static_cast<std::size_t>(variables.list.GetNumAttributeVars())
                                  : variables.pairAttributes.size());
    progress.BeginRows("reading the records");
}

Findings FindBins(TableReader& table, const BinOptions& options, Progress& progress, Care care)
{
    ColumnPlan plan = PlanColumns(table, options.columns);
    ProfileTable(table, plan, progress, care);
    Variables variables = MakeVariables(plan);
    Findings findings;
    findings.settings = options.settings;
    findings.dataName = table.GetName();
    AddPlan(findings, plan);
    AddVariables(findings, plan, variables);

    Announce(progress, variables);
    TableRecordSource source(table, plan, variables, progress);
    if (options.settings.method == Method::kSupervised)
        RunSupervised(findings, variables, source, options.settings, progress);
    else
        RunEqualFrequency(findings, variables, source, options.settings, progress);
    progress.Erase();
    findings.notes = MakeNotes(findings, plan, variables, source);
    return findings;
}

} // namespace

Findings FindBins(TableReader& table, const BinOptions& options, Progress& progress)
{
    try
    {
        // Nearly always it is as it seems, and then every number is read once only.
        return FindBins(table, options, progress, Care::kHasty);
    }
    catch (const NotOnlyNumbers&)
    {
        table.Rewind();
        return FindBins(table, options, progress, Care::kThorough);
    }
}
