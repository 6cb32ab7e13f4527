// One whole run over a file of doubles, column by column: what the library takes for data that another program has,
// too.

#include "bench/measure.h"
#include "bench/workloads.h"

#include <cstdio>
#include <cstdlib>
#include <exception>
#include <fstream>
#include <stdexcept>

namespace
{

std::vector<double> ReadColumn(std::ifstream& file, std::size_t numRecords)
{
    std::vector<double> column(numRecords);
    file.read(reinterpret_cast<char*>(column.data()), static_cast<std::streamsize>(numRecords * sizeof(double)));
    if (!file)
        throw std::runtime_error("the file is too short");
    return column;
}

} // namespace

/// rawrun FILE RECORDS ATTRIBUTES CATEGORIES BINS DIRECTORY
///
/// The target's codes come behind the attributes. Without categories it is an equal-frequency run. Prints the seconds
/// of processor time and the peak of memory, in MiB above the data.
int main(int argc, char** argv)
try
{
    if (argc != 7)
        throw std::runtime_error("usage: rawrun FILE RECORDS ATTRIBUTES CATEGORIES BINS DIRECTORY");
    std::ifstream file(argv[1], std::ios::binary);
    const std::size_t numRecords = std::strtoul(argv[2], nullptr, 10);
    Workload workload;
    workload.fNumCategories = std::atoi(argv[4]);
    workload.fNumbersOfBins = {std::atoi(argv[5])};
    for (int attribute = std::atoi(argv[3]); attribute > 0; --attribute)
        workload.fColumns.push_back(ReadColumn(file, numRecords));
    if (workload.fNumCategories > 0)
        workload.fTarget = ReadColumn(file, numRecords);

    double seconds = 0.0;
    const double memory = PeakMemory([&] { seconds = Seconds([&] { RunWhole(workload, argv[6]); }); });
    std::printf("%.3f %.1f\n", seconds, memory);
    return 0;
}
catch (const std::exception& failure)
{
    std::fprintf(stderr, "rawrun: %s\n", failure.what());
    return 1;
}
