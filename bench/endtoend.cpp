// Whole runs against the bare pipeline, in one process, turn by turn: see README.md.

#include "bench/barepipeline.h"
#include "bench/measure.h"
#include "bench/workloads.h"
#include "tests/support/tempdir.h"

#include <algorithm>
#include <cstdio>
#include <cstdlib>
#include <exception>

namespace
{

struct Goal
{
    const char* fWorkload;
    double fLargestRatio;
};

constexpr Goal kGoals[] = {{"W1", 1.2}, {"W2", 1.5}, {"W3", 1.5}, {"W4", 1.5}, {"W5", 1.0}, {"W6", 1.2}};

/// In thousand millions.
std::string TextOf(const std::optional<double>& instructions)
{
    char text[32];
    std::snprintf(text, sizeof(text), "%.2f", instructions.value_or(0.0) * 1e-9);
    return instructions ? text : "-";
}

void Measure(const Goal& goal, int numTurns)
{
    const Workload workload = MakeWorkload(goal.fWorkload);
    const TempDir directory;
    std::size_t numCutPoints = 0;
    volatile double sink = 0.0; // what the bare pipeline finds has to be worked out
    const auto runWhole = [&] { numCutPoints = RunWhole(workload, directory.Path()); };
    const auto runBare = [&] { sink = RunBare(workload, directory.Path()); };

    const double memory = PeakMemory(runWhole);
    const std::optional<double> instructions = Instructions(runWhole);
    std::vector<double> bare;
    std::vector<double> whole;
    std::vector<double> ratios;
    for (int turn = 0; turn < numTurns; ++turn)
    {
        bare.push_back(Seconds(runBare));
        whole.push_back(Seconds(runWhole));
        ratios.push_back(whole.back() / bare.back());
    }
    std::printf("| %s | %zu x %zu | %.3f | %.3f | %.2f | %.1f | %.1f | %s | %zu |\n", goal.fWorkload,
                workload.NumRecords(), workload.fColumns.size(), Median(bare), Median(whole), Median(ratios),
                goal.fLargestRatio, memory, TextOf(instructions).c_str(), numCutPoints);
    std::fflush(stdout);
}

} // namespace

/// endtoend [turns [workload...]]
int main(int argc, char** argv)
try
{
    const int numTurns = argc > 1 ? std::max(1, std::atoi(argv[1])) : 7;
    const std::vector<std::string> wanted(argv + std::min(argc, 2), argv + argc);

    std::printf("| workload | records x attributes | bare s | whole s | ratio | at most | peak MiB | 10^9 instructions "
                "| cut points |\n|---|--:|--:|--:|--:|--:|--:|--:|--:|\n");
    for (const Goal& goal : kGoals)
    {
        if (wanted.empty() || std::find(wanted.begin(), wanted.end(), goal.fWorkload) != wanted.end())
            Measure(goal, numTurns);
    }
    return 0;
}
catch (const std::exception& failure)
{
    std::fprintf(stderr, "endtoend: %s\n", failure.what());
    return 1;
}
