#include "barepipeline.h"

#include "data/tuplesort.h"

#include <algorithm>
#include <cmath>
#include <cstdio>
#include <filesystem>
#include <stdexcept>

namespace
{

constexpr std::size_t kBlock = 8192; ///< doubles, 64 KiB

void Spool(const std::vector<double>& column, const std::string& path)
{
    std::FILE* file = std::fopen(path.c_str(), "wb");
    if (file == nullptr)
        throw std::runtime_error("cannot write " + path);
    for (std::size_t first = 0; first < column.size(); first += kBlock)
        std::fwrite(column.data() + first, sizeof(double), std::min(kBlock, column.size() - first), file);
    std::fclose(file);
}

/// Reads a column block by block and hands each value to `use`.
template<class Use>
void ReadBack(const std::string& path, Use use)
{
    std::FILE* file = std::fopen(path.c_str(), "rb");
    if (file == nullptr)
        throw std::runtime_error("cannot read " + path);
    std::vector<double> block(kBlock);
    std::size_t index = 0;
    while (const std::size_t count = std::fread(block.data(), sizeof(double), kBlock, file))
        for (std::size_t i = 0; i < count; ++i) use(index++, block[i]);
    std::fclose(file);
}

double PartialEntropy(const std::vector<double>& side)
{
    double entropy = 0.0;
    for (std::size_t category = 1; category < side.size(); ++category)
    {
        const double p = side[category] / side[0];
        if (p > 0.0)
            entropy -= p * (std::log(p) / std::log(2.0));
    }
    return entropy * side[0];
}

/// The lowest partition entropy over all borders between distinct values.
double Scan(const std::vector<BINSortTuple>& tuples, int numCategories)
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
            best = std::min(best, (PartialEntropy(left) + PartialEntropy(right)) / total);
    }
    return best;
}

/// Joins an attribute with target and weight, sorts, and walks over it once.
template<class Tuple, class SetTarget, class Walk>
double Treat(const std::string& attribute, const Workload& workload, const std::string& target,
             const std::string& weight, std::vector<Tuple>& tuples, SetTarget setTarget, Walk walk)
{
    for (Tuple& tuple : tuples) tuple.fWeight = 1.0;
    if (!workload.fTarget.empty())
        ReadBack(target, [&](std::size_t i, double value) { setTarget(tuples[i], value); });
    if (!workload.fWeight.empty())
        ReadBack(weight, [&](std::size_t i, double value) { tuples[i].fWeight = value; });
    ReadBack(attribute, [&](std::size_t i, double value) { tuples[i].fValue = value; });
    SortTuples(tuples, static_cast<unsigned int>(tuples.size()), TieOrder::kAny);
    return walk(tuples);
}

} // namespace

double RunBare(const Workload& workload, const std::string& directory)
{
    const auto path = [&](const std::string& name) { return directory + "/bare-" + name; };
    std::vector<std::string> attributes;
    for (std::size_t column = 0; column < workload.fColumns.size(); ++column)
        attributes.push_back(path(std::to_string(column)));

    Spool(workload.fTarget, path("target"));
    Spool(workload.fWeight, path("weight"));
    for (std::size_t column = 0; column < attributes.size(); ++column)
        Spool(workload.fColumns[column], attributes[column]);

    double sum = 0.0;
    if (workload.fNumCategories > 0)
    {
        std::vector<BINSortTuple> tuples(workload.NumRecords());
        for (const std::string& attribute : attributes)
            sum += Treat(
                attribute, workload, path("target"), path("weight"), tuples,
                [](BINSortTuple& tuple, double code) { tuple.fTargetCode = static_cast<std::uint8_t>(code); },
                [&](const std::vector<BINSortTuple>& sorted) { return Scan(sorted, workload.fNumCategories); });
    }
    else
    {
        std::vector<BINValueTuple> tuples(workload.NumRecords());
        for (std::size_t run = 0; run < workload.fNumbersOfBins.size(); ++run)
            for (const std::string& attribute : attributes)
                sum += Treat(
                    attribute, workload, path("target"), path("weight"), tuples, [](BINValueTuple&, double) {},
                    [](const std::vector<BINValueTuple>& sorted)
                    {
                        double total = 0.0;
                        for (const BINValueTuple& tuple : sorted) total += tuple.fWeight;
                        return total;
                    });
    }
    for (const std::string& name : attributes) std::filesystem::remove(name);
    std::filesystem::remove(path("target"));
    std::filesystem::remove(path("weight"));
    return sum;
}
