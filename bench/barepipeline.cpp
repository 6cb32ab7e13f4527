#include "bench/barepipeline.h"

#include "data/tuplesort.h"

#include <algorithm>
#include <cmath>
#include <cstdio>
#include <functional>
#include <memory>
#include <stdexcept>

namespace
{

constexpr std::size_t kBlock = 8192; ///< doubles, 64 KiB

using File = std::unique_ptr<std::FILE, int (*)(std::FILE*)>;

File Open(const std::string& path, const char* mode)
{
    File file(std::fopen(path.c_str(), mode), std::fclose);
    if (file == nullptr)
        throw std::runtime_error("cannot open " + path);
    return file;
}

void Spool(const std::vector<double>& column, const std::string& path)
{
    const File file = Open(path, "wb");
    for (std::size_t first = 0; first < column.size(); first += kBlock)
        std::fwrite(column.data() + first, sizeof(double), std::min(kBlock, column.size() - first), file.get());
}

/// Hands each value of a file to `use`, with its index.
template<class Use>
void ReadBack(const std::string& path, Use use)
{
    const File file = Open(path, "rb");
    std::vector<double> block(kBlock);
    std::size_t index = 0;
    while (const std::size_t count = std::fread(block.data(), sizeof(double), kBlock, file.get()))
    {
        for (std::size_t i = 0; i < count; ++i) use(index++, block[i]);
    }
}

void SetTarget(BINSortTuple& tuple, double code)
{
    tuple.fTargetCode = static_cast<std::uint8_t>(code);
}

void SetTarget(BINValueTuple&, double) {}

/// The entropy of a count vector, times its weight.
double WeightedEntropy(const std::vector<double>& counts)
{
    double entropy = 0.0;
    for (std::size_t category = 1; category < counts.size(); ++category)
    {
        const double p = counts[category] / counts[0];
        if (p > 0.0)
            entropy -= p * (std::log(p) / std::log(2.0));
    }
    return entropy * counts[0];
}

/// The lowest partition entropy over all borders between distinct values.
double Walk(const std::vector<BINSortTuple>& tuples, int numCategories)
{
    std::vector<double> left(static_cast<std::size_t>(numCategories) + 1, 0.0);
    std::vector<double> right(left);
    for (const BINSortTuple& tuple : tuples)
    {
        right[0] += tuple.fWeight;
        right[tuple.fTargetCode + std::size_t{1}] += tuple.fWeight;
    }
    const double total = right[0];
    double best = total;
    for (std::size_t i = 0; i + 1 < tuples.size(); ++i)
    {
        const BINSortTuple& tuple = tuples[i];
        left[0] += tuple.fWeight;
        left[tuple.fTargetCode + std::size_t{1}] += tuple.fWeight;
        right[0] -= tuple.fWeight;
        right[tuple.fTargetCode + std::size_t{1}] -= tuple.fWeight;
        if (tuple.fValue != tuples[i + 1].fValue)
            best = std::min(best, (WeightedEntropy(left) + WeightedEntropy(right)) / total);
    }
    return best;
}

double Walk(const std::vector<BINValueTuple>& tuples, int)
{
    double total = 0.0;
    for (const BINValueTuple& tuple : tuples) total += tuple.fWeight;
    return total;
}

/// Joins each attribute with target and weight, sorts, and walks.
template<class Tuple>
double TreatAttributes(const Workload& workload, const std::function<std::string(const std::string&)>& pathOf)
{
    std::vector<Tuple> tuples(workload.NumRecords());
    double sum = 0.0;
    for (std::size_t column = 0; column < workload.fColumns.size(); ++column)
    {
        for (Tuple& tuple : tuples) tuple.fWeight = 1.0;
        if (!workload.fTarget.empty())
            ReadBack(pathOf("target"), [&](std::size_t i, double value) { SetTarget(tuples[i], value); });
        if (!workload.fWeight.empty())
            ReadBack(pathOf("weight"), [&](std::size_t i, double value) { tuples[i].fWeight = value; });
        ReadBack(pathOf(std::to_string(column)), [&](std::size_t i, double value) { tuples[i].fValue = value; });
        SortTuples(tuples, static_cast<unsigned int>(tuples.size()), TieOrder::kAny);
        sum += Walk(tuples, workload.fNumCategories);
    }
    return sum;
}

} // namespace

double RunBare(const Workload& workload, const std::string& directory)
{
    const auto pathOf = [&](const std::string& name) { return directory + "/bare-" + name; };
    Spool(workload.fTarget, pathOf("target"));
    Spool(workload.fWeight, pathOf("weight"));
    for (std::size_t column = 0; column < workload.fColumns.size(); ++column)
        Spool(workload.fColumns[column], pathOf(std::to_string(column)));

    double sum = 0.0;
    for (std::size_t run = 0; run < workload.fNumbersOfBins.size(); ++run)
    {
        sum += workload.fTarget.empty() ? TreatAttributes<BINValueTuple>(workload, pathOf)
                                        : TreatAttributes<BINSortTuple>(workload, pathOf);
    }
    return sum;
}
