// What the stages of a run cost on their own. One "item" is a value in the pass, a tuple from loading to the
// equal-frequency walk, a row of the value table in scan and split, a bin in merge and store.

#include "bench/workloads.h"

#include "base/bincancelmonitor.h"
#include "binning/binefpreprocess.h"
#include "binning/celltable.h"
#include "binning/cutscan.h"
#include "binning/entropysplit.h"
#include "data/binattributereader.h"
#include "data/bindatapreparator.h"
#include "data/tally.h"
#include "data/tuplesort.h"
#include "tests/support/tempdir.h"

#include <mcobnqrt/binoutput.h>

#include <benchmark/benchmark.h>

#include <algorithm>
#include <cmath>
#include <map>
#include <set>

namespace
{

constexpr std::size_t kMillion = 1000000;
constexpr int kTarget = 0;
constexpr int kAttribute = 1;

/// One informative attribute from the records to its value table, in single steps that can be done again.
class BinnedAttribute
{
public:
    BinnedAttribute(std::size_t numRecords, int numCategories)
        : fWorkload(MakeContinuous(numRecords, {1.0}, numCategories)), fList(ListOf(fWorkload)), fSource(fWorkload),
          fPreparator(&fList, &fMonitor, fDirectory.Path(), nullptr, 0),
          fReader(&fSource, &fPreparator, TupleKind::kWithTarget)
    {
        fReader.ReadRecords();
        Load();
        Tally();
    }

    void Load() { fReader.GetAttributeTargetData(kAttribute, kTarget, &fTuples); }

    void Tally()
    {
        fValues.clear();
        TallyDistinct(*fTuples, fReader.GetNumTuples(), fReader.GetNumDistinct(), fReader.GetNumTargetCats(), fValues,
                      fTable);
    }

    std::size_t Split() const
    {
        std::set<double> cutPoints;
        FindCutPoints(fValues, fTable, fReader.GetNumTargetCats(), true, 0, static_cast<int>(fValues.size()) - 1,
                      cutPoints);
        return cutPoints.size();
    }

    const std::vector<double>& Table() const { return fTable; }
    std::size_t NumRows() const { return fValues.size(); }

private:
    TempDir fDirectory; // first in, last out: the preparator removes its files
    Workload fWorkload;
    BINVarList fList;
    ColumnSource fSource;
    BINCancelMonitor fMonitor{nullptr};
    BINDataPreparator fPreparator;
    BINAttributeReader fReader;
    std::vector<BINSortTuple>* fTuples = nullptr; ///< the reader's
    std::vector<double> fValues;
    std::vector<double> fTable;
};

/// Made once for each shape: the library calls a benchmark several times, until it has run for long enough.
BinnedAttribute& Binned(std::size_t numRecords, int numCategories)
{
    static std::map<std::pair<std::size_t, int>, BinnedAttribute> made;
    return made.try_emplace({numRecords, numCategories}, numRecords, numCategories).first->second;
}

void CountItems(benchmark::State& state, std::size_t numItems)
{
    state.SetItemsProcessed(state.iterations() * static_cast<std::int64_t>(numItems));
}

void Pass(benchmark::State& state)
{
    const Workload workload = MakeContinuous(kMillion / 10, std::vector<double>(10, 1.0), 3);
    const TempDir directory;
    BINVarList list = ListOf(workload);
    while (state.KeepRunning())
    {
        ColumnSource source(workload);
        BINCancelMonitor monitor(nullptr);
        BINDataPreparator preparator(&list, &monitor, directory.Path(), nullptr, 0);
        benchmark::DoNotOptimize(preparator.PrepareData(&source).IsOK());
    }
    CountItems(state, workload.NumRecords() * (workload.fColumns.size() + 1));
}
BENCHMARK(Pass)->Unit(benchmark::kMillisecond);

/// Joins the files and sorts.
void Load(benchmark::State& state)
{
    BinnedAttribute& binned = Binned(kMillion, 3);
    while (state.KeepRunning()) binned.Load();
    CountItems(state, kMillion);
}
BENCHMARK(Load)->Unit(benchmark::kMillisecond);

using MakeValue = double (*)(double value, std::size_t index);

double Distinct(double value, std::size_t)
{
    return value;
}

double FewValued(double value, std::size_t)
{
    return std::floor(value * 125.0);
}

/// Rising, but for every hundredth value.
double NearlySorted(double value, std::size_t index)
{
    return index % 100 == 0 ? value : static_cast<double>(index);
}

void Sort(benchmark::State& state, MakeValue makeValue, TieOrder ties)
{
    const auto numTuples = static_cast<std::size_t>(state.range(0));
    const Workload workload = MakeContinuous(numTuples, {1.0}, 3);
    std::vector<BINSortTuple> unsorted;
    for (std::size_t i = 0; i < numTuples; ++i)
    {
        unsorted.push_back(
            {makeValue(workload.fColumns[0][i], i), static_cast<std::uint8_t>(workload.fTarget[i]), 1.0});
    }
    std::vector<BINSortTuple> tuples;
    while (state.KeepRunning())
    {
        state.PauseTiming();
        tuples = unsorted;
        state.ResumeTiming();
        SortTuples(tuples, static_cast<unsigned int>(numTuples), ties);
    }
    CountItems(state, numTuples);
}
#define BENCHMARK_SORT(name, makeValue, ties)                                                                          \
    BENCHMARK_CAPTURE(Sort, name, makeValue, ties)->Arg(10000)->Arg(kMillion)->Unit(benchmark::kMillisecond)
BENCHMARK_SORT(distinct, Distinct, TieOrder::kAny);
BENCHMARK_SORT(distinct_complete, Distinct, TieOrder::kComplete);
BENCHMARK_SORT(fewValued, FewValued, TieOrder::kAny);
BENCHMARK_SORT(fewValued_complete, FewValued, TieOrder::kComplete);
BENCHMARK_SORT(nearlySorted, NearlySorted, TieOrder::kAny);
BENCHMARK_SORT(nearlySorted_complete, NearlySorted, TieOrder::kComplete);

void Tally(benchmark::State& state)
{
    BinnedAttribute& binned = Binned(kMillion, 3);
    while (state.KeepRunning()) binned.Tally();
    CountItems(state, kMillion);
}
BENCHMARK(Tally)->Unit(benchmark::kMillisecond);

/// The first range of a split, with what a scan prepares once for a table.
void Scan(benchmark::State& state, std::size_t numRecords, int numCategories, bool isWhole)
{
    const BinnedAttribute& binned = Binned(numRecords, numCategories);
    std::vector<double> table = binned.Table();
    Numbers numbers(3);
    for (double& cell : table) cell *= isWhole ? 1.0 : 0.5 + numbers.Uniform();
    const int last = static_cast<int>(binned.NumRows()) - 1;
    while (state.KeepRunning())
    {
        CutScan scan(table, static_cast<std::size_t>(numCategories), true);
        CountVector left(static_cast<std::size_t>(numCategories) + 1, 0.0);
        CountVector right(left);
        scan.SumRows(0, last, right);
        benchmark::DoNotOptimize(scan.FindBestCut(0, last, left, right));
    }
    CountItems(state, binned.NumRows());
}
BENCHMARK_CAPTURE(Scan, whole_K3, kMillion, 3, true)->Unit(benchmark::kMillisecond);
BENCHMARK_CAPTURE(Scan, fractional_K3, kMillion, 3, false)->Unit(benchmark::kMillisecond);
BENCHMARK_CAPTURE(Scan, whole_K20, kMillion / 5, 20, true)->Unit(benchmark::kMillisecond);
BENCHMARK_CAPTURE(Scan, fractional_K20, kMillion / 5, 20, false)->Unit(benchmark::kMillisecond);

void Split(benchmark::State& state, std::size_t numRecords, int numCategories)
{
    const BinnedAttribute& binned = Binned(numRecords, numCategories);
    while (state.KeepRunning()) state.counters["cutPoints"] = static_cast<double>(binned.Split());
    CountItems(state, binned.NumRows());
}
BENCHMARK_CAPTURE(Split, K3, kMillion, 3)->Unit(benchmark::kMillisecond);
BENCHMARK_CAPTURE(Split, K20, kMillion / 5, 20)->Unit(benchmark::kMillisecond);

void EqualFrequency(benchmark::State& state)
{
    const Workload workload = MakeContinuous(kMillion, {1.0}, 3);
    std::vector<BINValueTuple> tuples;
    for (const double value : workload.fColumns[0]) tuples.push_back({value, 1.0});
    SortTuples(tuples, static_cast<unsigned int>(tuples.size()), TieOrder::kAny);
    while (state.KeepRunning())
    {
        std::vector<double> cuts;
        std::vector<double> counts;
        BINEFPreProcess(static_cast<int>(state.range(0)), true)
            .BinEqualFrequency(&tuples, static_cast<unsigned int>(tuples.size()), cuts, counts,
                               static_cast<double>(tuples.size()));
        benchmark::DoNotOptimize(cuts.data());
    }
    CountItems(state, tuples.size());
}
BENCHMARK(EqualFrequency)->Arg(10)->Arg(100)->Arg(10000)->Unit(benchmark::kMillisecond);

/// Cells of three categories with weight in each; every other bin is small.
std::vector<double> CellsOf(std::size_t numBins)
{
    std::vector<double> cells;
    for (std::size_t bin = 0; bin < numBins; ++bin)
    {
        const double weight = bin % 2 == 0 ? 100.0 : 10.0;
        cells.insert(cells.end(), {6.0 * weight, weight, 2.0 * weight, 3.0 * weight});
    }
    return cells;
}

std::set<double> CutPointsOf(std::size_t numBins)
{
    std::set<double> cutPoints;
    for (std::size_t bin = 1; bin < numBins; ++bin) cutPoints.insert(cutPoints.end(), static_cast<double>(bin));
    return cutPoints;
}

void Merge(benchmark::State& state)
{
    const auto numBins = static_cast<std::size_t>(state.range(0));
    while (state.KeepRunning())
    {
        state.PauseTiming();
        std::vector<double> cells = CellsOf(numBins);
        std::set<double> cutPoints = CutPointsOf(numBins);
        state.ResumeTiming();
        MergeSmallBins(0.5, 3, cells, cutPoints);
    }
    CountItems(state, numBins);
}
BENCHMARK(Merge)->Arg(10)->Arg(100)->Arg(1000)->Unit(benchmark::kMicrosecond);

/// A hundred pairs in a store of their own.
void Store(benchmark::State& state)
{
    constexpr int kNumPairs = 100;
    const auto numBins = static_cast<std::size_t>(state.range(0));
    const std::vector<double> cells = CellsOf(numBins);
    const std::set<double> cutPoints = CutPointsOf(numBins);
    while (state.KeepRunning())
    {
        BINOutput output;
        for (int attribute = kAttribute; attribute < kAttribute + kNumPairs; ++attribute)
        {
            output.SetAttributeTargetResults(MCBinning::MCStatus(), cutPoints, cells, attribute, kTarget, 0U, 0.0, 0.0,
                                             0.0, 0.0, 0.0);
        }
    }
    CountItems(state, kNumPairs * numBins);
}
BENCHMARK(Store)->Arg(10)->Arg(100)->Unit(benchmark::kMicrosecond);

} // namespace
