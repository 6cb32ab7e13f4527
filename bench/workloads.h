#ifndef MCOBNQRT_BENCH_WORKLOADS_H
#define MCOBNQRT_BENCH_WORKLOADS_H

#include <mcobnqrt/mcobnqrt.h>

#include <cstddef>
#include <cstdint>
#include <string>
#include <vector>

/// Random numbers that are the same bits on every machine: the generator splitmix64, and nothing but additions and
/// exact arithmetic on what it gives.
class Numbers
{
public:
    explicit Numbers(std::uint64_t seed) : fState(seed) {}

    std::uint64_t Next()
    {
        std::uint64_t z = (fState += 0x9e3779b97f4a7c15U);
        z = (z ^ (z >> 30)) * 0xbf58476d1ce4e5b9U;
        z = (z ^ (z >> 27)) * 0x94d049bb133111ebU;
        return z ^ (z >> 31);
    }

    /// Uniform in [0, 1).
    double Uniform() { return static_cast<double>(Next() >> 11) * 0x1p-53; }

    /// Nearly standard normal: the sum of twelve uniforms, less their mean.
    double Normal()
    {
        double sum = -6.0;
        for (int i = 0; i < 12; ++i) sum += Uniform();
        return sum;
    }

    int Below(int limit) { return static_cast<int>(Next() % static_cast<std::uint64_t>(limit)); }

private:
    std::uint64_t fState;
};

/// A data set and what is to be done with it. Columns are held as the host would hold them.
struct Workload
{
    std::vector<std::vector<double>> fColumns; ///< the attributes
    std::vector<double> fTarget;               ///< codes; empty: an equal-frequency run
    std::vector<double> fWeight;               ///< empty without a weight
    int fNumCategories = 0;                    ///< of the target
    std::vector<int> fNumbersOfBins{10};       ///< one run for each

    std::size_t NumRecords() const { return fColumns.front().size(); }
};

/// One of the workloads W1 to W6, which README.md tells of; `scale` divides the number of records.
Workload MakeWorkload(const std::string& name, std::size_t scale = 1);

/// A random target, and for each of the `shifts` an attribute: normal values whose mean moves by so much from one
/// category to the next.
Workload MakeContinuous(std::size_t numRecords, const std::vector<double>& shifts, int numCategories);

/// Streams a workload as a host would: target, weight, attributes. The workload outlives it.
class ColumnSource : public IBINRecordSource
{
public:
    explicit ColumnSource(const Workload& workload);

    bool HasNext() override { return fNextRow < fNumRecords; }
    const MCCommon::Record* Next() override;

private:
    std::vector<const double*> fFields;
    std::size_t fNumRecords;
    std::size_t fNextRow = 0;
    MCCommon::Record fRecord{0};
};

/// The variables of a workload, in the order of its source.
BINVarList ListOf(const Workload& workload);

/// A whole run through the factories, with its temporary files in `directory`. \return the number of cut points found.
/// \throw std::runtime_error if the run ends with an error.
std::size_t RunWhole(const Workload& workload, const std::string& directory);

#endif
