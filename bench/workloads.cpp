#include "workloads.h"

#include <cmath>
#include <stdexcept>

namespace
{

std::vector<double> MakeTarget(std::size_t numRecords, int numCategories)
{
    Numbers numbers(1);
    std::vector<double> target(numRecords);
    for (double& code : target) code = numbers.Below(numCategories);
    return target;
}

/// Normal values whose mean moves by `shift` from one category to the next.
std::vector<double> MakeShifted(const std::vector<double>& target, double shift, std::uint64_t seed)
{
    Numbers numbers(seed);
    std::vector<double> values;
    values.reserve(target.size());
    for (const double code : target) values.push_back(numbers.Normal() + shift * code);
    return values;
}

void MakeWhole(std::vector<double>& values)
{
    for (double& value : values) value = std::floor(value * 125.0);
}

template<class Algorithm, class Run>
void RunAndRequire(std::unique_ptr<Algorithm> algorithm, Run run)
{
    if (algorithm == nullptr)
        throw std::runtime_error("no algorithm for this workload");
    const MCBinning::MCStatus status = run(*algorithm);
    if (status.IsError())
        throw std::runtime_error("the run ended with " + std::to_string(status.GetErrorCode()));
}

template<class Results, class Output>
std::size_t CountCutPoints(const Output& output)
{
    std::vector<Results> results;
    output.GetAllCutPoints(results);
    std::size_t numCutPoints = 0;
    for (const Results& result : results) numCutPoints += result.GetCutPoints().size();
    return numCutPoints;
}

} // namespace

Workload MakeContinuous(std::size_t numRecords, int numAttributes, int numCategories)
{
    constexpr double kShifts[] = {0.25, 0.5, 1.0, 1.5, 2.0, 0.0, 0.0, 0.0, 0.0, 0.0};
    Workload workload;
    workload.fNumCategories = numCategories;
    workload.fTarget = MakeTarget(numRecords, numCategories);
    for (int attribute = 0; attribute < numAttributes; ++attribute)
        workload.fColumns.push_back(
            MakeShifted(workload.fTarget, kShifts[attribute % 10], 100 + static_cast<std::uint64_t>(attribute)));
    return workload;
}

Workload MakeWorkload(const std::string& name, int scale)
{
    const auto scaled = [scale](std::size_t numRecords) { return numRecords / static_cast<std::size_t>(scale); };
    Workload workload;
    if (name == "W1")
        workload = MakeContinuous(scaled(1000000), 10, 3);
    else if (name == "W2")
    {
        workload = MakeContinuous(scaled(1000000), 10, 3);
        for (std::vector<double>& column : workload.fColumns) MakeWhole(column);
    }
    else if (name == "W3")
        workload = MakeContinuous(scaled(10000), 10, 3);
    else if (name == "W4")
    {
        workload = MakeContinuous(scaled(1000000), 10, 3);
        workload.fNumCategories = 0;
        workload.fTarget.clear();
        workload.fNumbersOfBins = {10, 100};
        Numbers numbers(2);
        for (std::size_t i = 0; i < workload.NumRecords(); ++i) workload.fWeight.push_back(0.5 + numbers.Uniform());
    }
    else if (name == "W5")
        workload = MakeContinuous(scaled(200000), 5, 20);
    else
        throw std::runtime_error("no workload of that name: " + name);
    workload.fName = name;
    return workload;
}

ColumnSource::ColumnSource(const Workload& workload) : fNumRecords(workload.NumRecords()), fRecord(0)
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
    // Neither of the rounding options: weights stay as they are, with their fractions.
    constexpr auto kUnrounded = static_cast<IBINVariable::BINWRoundingOption>(2);
    BINVarList list;
    if (!workload.fTarget.empty())
        list.AddCatVar("target", "", workload.fNumCategories, IBINVariable::MeasureNumericCategorical,
                       IBINVariable::RoleTarget);
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
    std::size_t numCutPoints = 0;
    if (workload.fNumCategories > 0)
    {
        BINSettings settings;
        settings.SetNumberOfBins(workload.fNumbersOfBins.front());
        settings.SetTempDirName(directory);
        RunAndRequire(std::unique_ptr<IBINAlgorithm>(BINFactory().CreateBINAlgorithm(settings, list)),
                      [&](IBINAlgorithm& algorithm)
                      {
                          const MCBinning::MCStatus status = algorithm.Run(&source, nullptr, nullptr);
                          numCutPoints = CountCutPoints<BINAttributeTargetResults>(*algorithm.GetOutput());
                          return status;
                      });
        return numCutPoints;
    }
    EFBINSettings settings;
    settings.SetNumberOfBins(workload.fNumbersOfBins.front());
    settings.SetTempDirName(directory);
    RunAndRequire(std::unique_ptr<IEFBINAlgorithm>(EFBINFactory().CreateEFBINAlgorithm(settings, list)),
                  [&](IEFBINAlgorithm& algorithm)
                  {
                      MCBinning::MCStatus status;
                      for (const int numberOfBins : workload.fNumbersOfBins)
                      {
                          algorithm.GetSettings()->SetNumberOfBins(numberOfBins);
                          status = algorithm.Run(&source, nullptr);
                      }
                      numCutPoints = CountCutPoints<BINAttributeResults>(*algorithm.GetOutput());
                      return status;
                  });
    return numCutPoints;
}
