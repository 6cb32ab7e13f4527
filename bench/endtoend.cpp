// Whole runs against the bare pipeline, in one process, turn by turn: see README.md.

#include "barepipeline.h"
#include "workloads.h"

#include <algorithm>
#include <chrono>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <exception>
#include <filesystem>
#include <fstream>
#include <functional>
#include <string>
#include <vector>

#include <malloc.h>

namespace
{

double Seconds(const std::function<void()>& work)
{
    const auto start = std::chrono::steady_clock::now();
    work();
    return std::chrono::duration<double>(std::chrono::steady_clock::now() - start).count();
}

double Median(std::vector<double> values)
{
    std::sort(values.begin(), values.end());
    return values[values.size() / 2];
}

/// In KiB, from the kernel's count of this process; 0 where it doesn't give one.
long ProcessMemory(const char* field)
{
    std::ifstream status("/proc/self/status");
    std::string line;
    while (std::getline(status, line))
        if (line.rfind(field, 0) == 0)
            return std::atol(line.c_str() + std::strlen(field));
    return 0;
}

/// How far the memory of the process rises above where it stands, in MiB.
double PeakMemory(const std::function<void()>& work)
{
    malloc_trim(0);
    std::ofstream("/proc/self/clear_refs") << "5"; // sets the peak back to the present
    const long before = ProcessMemory("VmRSS:");
    work();
    return static_cast<double>(ProcessMemory("VmHWM:") - before) / 1024.0;
}

void Measure(const std::string& name, double limit, int numTurns, int scale, const std::string& directory)
{
    const Workload workload = MakeWorkload(name, scale);
    std::size_t numCutPoints = 0;
    volatile double sink = 0.0;
    std::vector<double> bare;
    std::vector<double> whole;
    std::vector<double> ratio;
    const double memory = PeakMemory([&] { numCutPoints = RunWhole(workload, directory); });
    for (int turn = 0; turn < numTurns; ++turn)
    {
        bare.push_back(Seconds([&] { sink = RunBare(workload, directory); }));
        whole.push_back(Seconds([&] { numCutPoints = RunWhole(workload, directory); }));
        ratio.push_back(whole.back() / bare.back());
    }
    std::printf("| %s | %zu x %zu | %.3f | %.3f | %.2f | %.2f | %.1f | %zu |\n", name.c_str(), workload.NumRecords(),
                workload.fColumns.size(), Median(bare), Median(whole), Median(ratio), limit, memory, numCutPoints);
    std::fflush(stdout);
}

} // namespace

int main(int argc, char** argv)
try
{
    // endtoend [turns] [scale] [workload...]
    const int numTurns = argc > 1 ? std::max(1, std::atoi(argv[1])) : 7;
    const int scale = argc > 2 ? std::max(1, std::atoi(argv[2])) : 1;
    const std::vector<std::string> wanted(argv + std::min(argc, 3), argv + argc);
    const std::string directory = std::filesystem::temp_directory_path().string();

    std::printf("| workload | records x attributes | bare s | whole s | ratio | at most | peak MiB | cuts |\n");
    std::printf("|---|--:|--:|--:|--:|--:|--:|--:|\n");
    for (const auto& [name, limit] :
         {std::pair<const char*, double>{"W1", 1.2}, {"W2", 1.5}, {"W3", 1.5}, {"W4", 1.5}, {"W5", 1.0}})
        if (wanted.empty() || std::find(wanted.begin(), wanted.end(), name) != wanted.end())
            Measure(name, limit, numTurns, scale, directory);
    return 0;
}
catch (const std::exception& failure)
{
    std::fprintf(stderr, "endtoend: %s\n", failure.what());
    return 1;
}
