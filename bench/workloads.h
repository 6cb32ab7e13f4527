#ifndef MCOBNQRT_BENCH_WORKLOADS_H
#define MCOBNQRT_BENCH_WORKLOADS_H

#include <mcobnqrt/mcobnqrt.h>

#include <cstdint>
#include <memory>
#include <string>
#include <vector>

/// Random numbers that are the same bits on every machine: the generator splitmix64, and nothing but exact arithmetic on
/// what it gives.
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
    std::string fName;
    std::string fWhat;
    int fNumCategories = 0;                    ///< of the target; 0: an equal-frequency run
    std::vector<std::vector<double>> fColumns; ///< the attributes
    std::vector<double> fTarget;               ///< codes; empty without a target
    std::vector<double> fWeight;               ///< empty without a weight
    std::vector<int> fNumbersOfBins{10};       ///< one run for each

    std::size_t NumRecords() const { return fColumns.front().size(); }
};

/// The workloads W1 to W5, by name; `scale` divides the number of records.
Workload MakeWorkload(const std::string& name, int scale = 1);

/// As W1, with any number of records and attributes.
Workload MakeContinuous(std::size_t numRecords, int numAttributes, int numCategories);

/// Streams a workload as a host would: target, weight, attributes.
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
    MCCommon::Record fRecord;
};

BINVarList ListOf(const Workload& workload);

/// A whole run through the factories; the results are kept up to the end. \return the number of cut points found.
std::size_t RunWhole(const Workload& workload, const std::string& directory);

#endif
