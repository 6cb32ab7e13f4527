#include "bench/workloads.h"

#include <cmath>
#include <memory>
#include <stdexcept>

namespace
{

/// The seeds of the generators. That of an attribute is kAttributeSeed and its number.
constexpr std::uint64_t kTargetSeed = 1;
constexpr std::uint64_t kWeightSeed = 2;
constexpr std::uint64_t kAttributeSeed = 100;

std::vector<double> MakeTarget(std::size_t numRecords, int numCategories)
{
    Numbers numbers(kTargetSeed);
    std::vector<double> target(numRecords);
    for (double& code : target) code = numbers.Below(numCategories);
    return target;
}

std::vector<double> MakeShifted(const std::vector<double>& target, double shift, std::uint64_t seed)
{
    Numbers numbers(seed);
    std::vector<double> values;
    values.reserve(target.size());
    for (const double code : target) values.push_back(numbers.Normal() + shift * code);
    return values;
}

void MakeWhole(Workload& workload)
{
    for (std::vector<double>& column : workload.fColumns)
    {
        for (double& value : column) value = std::floor(value * 125.0);
    }
}

void AddWeight(Workload& workload)
{
    Numbers numbers(kWeightSeed);
    for (std::size_t i = 0; i < workload.NumRecords(); ++i) workload.fWeight.push_back(0.5 + numbers.Uniform());
}

/// Makes the weights multiples of 2^-31: sums of a million of them are exact.
void PutWeightsOnGrid(Workload& workload)
{
    for (double& weight : workload.fWeight) weight = std::floor(weight * 0x1p31) * 0x1p-31;
}

template<class Settings>
Settings SettingsFor(const std::string& directory)
{
    Settings settings;
    settings.SetTempDirName(directory);
    return settings;
}

/// Makes one run for each number of bins. \return the number of cut points of all of them.
template<class Results, class Algorithm, class Run>
std::size_t RunAll(std::unique_ptr<Algorithm> algorithm, const std::vector<int>& numbersOfBins, Run run)
{
    if (algorithm == nullptr)
        throw std::runtime_error("no algorithm for this workload");
    for (const int numberOfBins : numbersOfBins)
    {
        algorithm->GetSettings()->SetNumberOfBins(numberOfBins);
        const MCBinning::MCStatus status = run(*algorithm);
        if (status.IsError())
            throw std::runtime_error("the run ended with error " + std::to_string(status.GetErrorCode()));
    }
    std::vector<Results> results;
    algorithm->GetOutput()->GetAllCutPoints(results);
    std::size_t numCutPoints = 0;
    for (const Results& result : results) numCutPoints += result.GetCutPoints().size();
    return numCutPoints;
}

} // namespace

Workload MakeContinuous(std::size_t numRecords, const std::vector<double>& shifts, int numCategories)
{
    Workload workload;
    workload.fNumCategories = numCategories;
    workload.fTarget = MakeTarget(numRecords, numCategories);
    for (std::size_t attribute = 0; attribute < shifts.size(); ++attribute)
        workload.fColumns.push_back(MakeShifted(workload.fTarget, shifts[attribute], kAttributeSeed + attribute));
    return workload;
}

Workload MakeWorkload(const std::string& name, std::size_t scale)
{
    const std::vector<double> informative{0.25, 0.5, 1.0, 1.5, 2.0};
    const std::vector<double> informativeAndNoise{0.25, 0.5, 1.0, 1.5, 2.0, 0.0, 0.0, 0.0, 0.0, 0.0};
    if (name == "W3")
        return MakeContinuous(10000 / scale, informativeAndNoise, 3);
    if (name == "W5")
        return MakeContinuous(200000 / scale, informative, 20);
    if (name != "W1" && name != "W2" && name != "W4" && name != "W6")
        throw std::runtime_error("no workload of that name: " + name);

    Workload workload = MakeContinuous(1000000 / scale, informativeAndNoise, 3);
    if (name == "W2")
        MakeWhole(workload);
    if (name == "W4")
    {
        workload.fTarget.clear();
        AddWeight(workload);
        workload.fNumbersOfBins = {10, 100};
    }
    if (name == "W6")
    {
        AddWeight(workload);
        PutWeightsOnGrid(workload);
    }
    return workload;
}

ColumnSource::ColumnSource(const Workload& workload) : fNumRecords(workload.NumRecords())
{
    if (!workload.fTarget.empty())
        fFields.push_back(workload.fTarget.data());
    if (!workload.fWeight.empty())
        fFields.push_back(workload.fWeight.data());
    for (const std::vector<double>& column : workload.fColumns) fFields.push_back(column.data());
    fRecord = MCCommon::Record(static_cast<int>(fFields.size()));
}

const MCCommon::Record* ColumnSource::Next()
{
    for (std::size_t field = 0; field < fFields.size(); ++field)
        fRecord[static_cast<int>(field)] = fFields[field][fNextRow];
    ++fNextRow;
    return &fRecord;
}

BINVarList ListOf(const Workload& workload)
{
    // None of the options that round: the weights stay as they are, with their fractions.
    constexpr auto kUnrounded = static_cast<IBINVariable::BINWRoundingOption>(2);
    BINVarList list;
    if (!workload.fTarget.empty())
    {
        list.AddCatVar("target", "", workload.fNumCategories, IBINVariable::MeasureNumericCategorical,
                       IBINVariable::RoleTarget);
    }
    if (!workload.fWeight.empty())
        list.AddWeightVar("weight", "", kUnrounded);
    for (std::size_t column = 0; column < workload.fColumns.size(); ++column)
        list.AddContVar("x" + std::to_string(column), "", IBINVariable::RoleAttribute);
    return list;
}

std::size_t RunWhole(const Workload& workload, const std::string& directory)
{
    BINVarList list = ListOf(workload);
    ColumnSource source(workload);
    if (workload.fTarget.empty())
    {
        auto settings = SettingsFor<EFBINSettings>(directory);
        std::unique_ptr<IEFBINAlgorithm> algorithm(EFBINFactory().CreateEFBINAlgorithm(settings, list));
        return RunAll<BINAttributeResults>(std::move(algorithm), workload.fNumbersOfBins,
                                           [&](IEFBINAlgorithm& made) { return made.Run(&source, nullptr); });
    }
    auto settings = SettingsFor<BINSettings>(directory);
    std::unique_ptr<IBINAlgorithm> algorithm(BINFactory().CreateBINAlgorithm(settings, list));
    return RunAll<BINAttributeTargetResults>(std::move(algorithm), workload.fNumbersOfBins,
                                             [&](IBINAlgorithm& made) { return made.Run(&source, nullptr, nullptr); });
}
