// How the time of one attribute grows with the records: loading, sorting, tally, split and storing, without the pass.

#include "bench/measure.h"
#include "bench/workloads.h"
#include "tests/support/tempdir.h"

#include <algorithm>
#include <cmath>
#include <cstdio>
#include <cstdlib>
#include <exception>
#include <memory>
#include <stdexcept>

namespace
{

constexpr std::size_t kSizes[] = {10000, 20000, 50000, 100000, 200000, 500000, 1000000, 2000000, 5000000, 10000000};

/// Variable indices of the two attributes; the target comes first.
constexpr int kInformative = 1;
constexpr int kNoise = 2;

void Run(IBINAlgorithm& algorithm, IBINRecordSource* source, int attribute)
{
    const std::vector<int> attributes{attribute};
    if (algorithm.Run(source, &attributes, nullptr).IsError())
        throw std::runtime_error("the run ended with an error");
}

void PrintAttribute(IBINAlgorithm& algorithm, int attribute, std::size_t numRecords, int numTurns)
{
    std::vector<double> seconds(static_cast<std::size_t>(numTurns));
    for (double& turn : seconds) turn = Seconds([&] { Run(algorithm, nullptr, attribute); });
    const double median = Median(seconds);
    const auto n = static_cast<double>(numRecords);

    BINAttributeTargetResults result;
    algorithm.GetOutput()->GetAttributeTargetCutPoints(attribute, 0, result);
    std::printf(" %.2f | %.2f | %zu |", median * 1e3, median * 1e9 / (n * std::log2(n)), result.GetCutPoints().size());
}

void Measure(std::size_t numRecords, int numTurns)
{
    const Workload workload = MakeContinuous(numRecords, {1.0, 0.0}, 3);
    const TempDir directory;
    BINSettings settings;
    settings.SetNumberOfBins(10);
    settings.SetTempDirName(directory.Path());
    BINVarList list = ListOf(workload);
    ColumnSource source(workload);
    const std::unique_ptr<IBINAlgorithm> algorithm(BINFactory().CreateBINAlgorithm(settings, list));
    Run(*algorithm, &source, kInformative); // makes the pass

    std::printf("| %zu |", numRecords);
    for (const int attribute : {kInformative, kNoise}) PrintAttribute(*algorithm, attribute, numRecords, numTurns);
    std::printf("\n");
    std::fflush(stdout);
}

} // namespace

/// growth [turns]
int main(int argc, char** argv)
try
{
    const int numTurns = argc > 1 ? std::max(1, std::atoi(argv[1])) : 5;
    std::printf(
        "| records | informative ms | ns / (n log2 n) | cut points | noise ms | ns / (n log2 n) | cut points |\n"
        "|--:|--:|--:|--:|--:|--:|--:|\n");
    for (const std::size_t numRecords : kSizes) Measure(numRecords, numTurns);
    return 0;
}
catch (const std::exception& failure)
{
    std::fprintf(stderr, "growth: %s\n", failure.what());
    return 1;
}
