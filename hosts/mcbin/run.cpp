#include "hosts/mcbin/run.h"

#include "bins/run.h"
#include "bins/words.h"
#include "hosts/mcbin/failure.h"
#include "hosts/mcbin/input/categorycount.h"
#include "hosts/mcbin/input/columnplan.h"
#include "hosts/mcbin/input/recordsource.h"
#include "hosts/mcbin/input/tableprofile.h"
#include "hosts/mcbin/input/tablereader.h"
#include "hosts/mcbin/input/variables.h"
#include "hosts/mcbin/interrupt.h"
#include "hosts/mcbin/notes.h"
#include "hosts/mcbin/options.h"
#include "hosts/mcbin/progress.h"

#include <algorithm>

namespace
{

constexpr int kNumRecordsBetweenReports = 50000;

/// A cancelled run is no failure: it may have found something.
void ThrowIfFailed(const Bins& bins)
{
    if (IsInterrupted() && bins.results.empty())
        throw Interrupted();
    if (bins.status.IsError() && bins.status.GetErrorCode() != MCBinning::BINStatusCancelled)
        throw Failure(DescribeStatus(bins.status));
}

void RunLibrary(Bins& bins, Variables& variables, TableRecordSource& source, const std::string& tempDirectory,
                Progress& progress)
{
    InterruptQuery query;
    RunHost host;
    host.records = &source;
    host.values = &source.GetValues();
    host.weightGrid = &source.GetWeightGrid();
    host.cancel = &query;
    host.listener = &progress;
    host.numRecordsBetweenReports = kNumRecordsBetweenReports;
    host.tempDirectory = tempDirectory;
    const bool hasPairs = !variables.pairAttributes.empty();
    RunBinning(bins, variables.list, hasPairs ? &variables.pairAttributes : nullptr,
               hasPairs ? &variables.pairTargets : nullptr, host);
    ThrowIfFailed(bins);
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

Outcome FindBins(TableReader& table, const BinOptions& options, Progress& progress, Care care)
{
    ColumnPlan plan = PlanColumns(table, options.columns);
    ProfileTable(table, plan, progress, care);
    ScaleWeights(table, plan, progress);
    OrderCategories(table, plan, progress);
    Variables variables = MakeVariables(plan);
    Outcome outcome;
    outcome.leftOut = plan.DescribeLeftOut();
    Bins& bins = outcome.bins;
    bins.settings = options.settings;
    bins.dataName = table.GetName();
    bins.numRecords = plan.numRows;
    bins.missingTexts = plan.missingTexts;
    bins.variables = DescribeVariables(plan, variables);
    if (std::any_of(plan.columns.begin(), plan.columns.end(), [](const Column& column) { return column.isWeight; }))
        bins.numRecordsWithoutWeight = plan.numWithoutWeight;

    Announce(progress, variables);
    TableRecordSource source(table, plan, variables, progress);
    RunLibrary(bins, variables, source, options.tempDirectory, progress);
    progress.Erase();
    outcome.notes = table.GetNotes();
    for (std::string& note : MakeNotes(bins, plan, variables, source)) outcome.notes.push_back(std::move(note));
    return outcome;
}

} // namespace

Outcome FindBins(TableReader& table, const BinOptions& options, Progress& progress)
{
    try
    {
        // Nearly always a column that begins with numbers holds nothing else, and then every number is parsed once
        // only.
        return FindBins(table, options, progress, Care::kHasty);
    }
    catch (const NotOnlyNumbers&)
    {
        table.Rewind();
        return FindBins(table, options, progress, Care::kThorough);
    }
}
