#include "commands.h"

#include "failure.h"
#include "recordsource.h"
#include "report.h"
#include "statuswords.h"
#include "tableprofile.h"
#include "tablereader.h"
#include "variables.h"

#include <mcobnqrt/mcobnqrt.h>

#include <memory>
#include <optional>
#include <vector>

namespace
{

/// A supervised run refuses to work without a number of bins, but uses it for pre-binning alone. That is off as long as
/// no distinct value threshold is set, so the number changes no result. With 1000 bins pre-binning would cost
/// hardly any precision: a border is off by a thousandth of the weight at most.
constexpr int kPreBins = 1000;

void ThrowIfError(const MCBinning::MCStatus& status)
{
    if (status.IsError())
        throw Failure(DescribeStatus(status));
}

} // namespace

void RunSupervised(const SupervisedOptions& options, std::ostream& os)
{
    TableReader table(options.file);
    const TableProfile profile = ProfileTable(table, table.FindColumn(options.target));
    Variables variables = MakeVariables(profile);
    TableRecordSource source(table, variables, profile.nRows);

    BINSettings settings;
    settings.SetNumberOfBins(kPreBins);
    BINFactory factory;
    const std::unique_ptr<IBINAlgorithm> algorithm(factory.CreateBINAlgorithm(settings, variables.list));
    ThrowIfError(factory.GetStatus());
    ThrowIfError(algorithm->Run(&source, nullptr, nullptr));

    std::vector<BINAttributeTargetResults> results;
    ThrowIfError(algorithm->GetOutput()->GetAllCutPoints(results));
    PrintResults(os, variables.list, results);
    PrintLeftOut(os, profile);
}

void RunEqualFrequency(const EqualFrequencyOptions& options, std::ostream& os)
{
    TableReader table(options.file);
    const TableProfile profile = ProfileTable(table, std::nullopt);
    Variables variables = MakeVariables(profile);
    TableRecordSource source(table, variables, profile.nRows);

    EFBINSettings settings;
    settings.SetNumberOfBins(options.bins);
    EFBINFactory factory;
    const std::unique_ptr<IEFBINAlgorithm> algorithm(factory.CreateEFBINAlgorithm(settings, variables.list));
    ThrowIfError(factory.GetStatus());
    ThrowIfError(algorithm->Run(&source, nullptr));

    std::vector<BINAttributeResults> results;
    ThrowIfError(algorithm->GetOutput()->GetAllCutPoints(results));
    PrintResults(os, variables.list, results);
    PrintLeftOut(os, profile);
}
