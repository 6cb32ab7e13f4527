// One whole run over a file of doubles, column by column: what the library takes for data that another program has, too.
//
//     rawrun FILE RECORDS ATTRIBUTES CATEGORIES BINS DIRECTORY
//
// The target's codes come behind the attributes. Without categories it is an equal-frequency run. Prints the seconds.

#include "workloads.h"

#include <chrono>
#include <cstdio>
#include <cstdlib>
#include <exception>
#include <fstream>
#include <stdexcept>
#include <string>

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

    const auto start = std::chrono::steady_clock::now();
    RunWhole(workload, argv[6]);
    std::printf("%.3f\n", std::chrono::duration<double>(std::chrono::steady_clock::now() - start).count());
    return 0;
}
catch (const std::exception& error)
{
    std::fprintf(stderr, "%s\n", error.what());
    return 1;
}
