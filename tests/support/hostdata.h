#ifndef MCOBNQRT_TESTS_HOSTDATA_H
#define MCOBNQRT_TESTS_HOSTDATA_H

#include <mcobnqrt/mcobnqrt.h>

#include <algorithm>
#include <functional>
#include <initializer_list>
#include <random>
#include <string>
#include <utility>
#include <vector>

/// Builds a variable list by names alone. Variables stand in the order of the calls.
class AVarList
{
public:
    AVarList& WithAttribute(const std::string& name)
    {
        fList.AddContVar(name, "", IBINVariable::RoleAttribute);
        return *this;
    }

    AVarList& WithTarget(const std::string& name, int numCategories)
    {
        fList.AddCatVar(name, "", numCategories, IBINVariable::MeasureStringCategorical, IBINVariable::RoleTarget);
        return *this;
    }

    AVarList& WithCategorical(const std::string& name, int numCategories)
    {
        fList.AddCatVar(name, "", numCategories, IBINVariable::MeasureNumericCategorical, IBINVariable::RoleAttribute);
        return *this;
    }

    AVarList& WithWeight(IBINVariable::BINWRoundingOption option = IBINVariable::RoundClosest)
    {
        fList.AddWeightVar("weight", "", option);
        return *this;
    }

    operator BINVarList() const { return fList; }

private:
    BINVarList fList;
};

/// A rounding option that leaves weights as they are, fractions included.
inline constexpr auto kUnrounded = static_cast<IBINVariable::BINWRoundingOption>(2);

/// A host's record source over rows in memory. It counts what it is asked, and `fBeforeNext`, called with the number of
/// the row that is asked for, can misbehave.
class RecordTable : public IBINRecordSource
{
public:
    RecordTable() = default;
    RecordTable(std::initializer_list<std::vector<double>> rows) : fRows(rows) {}

    void Add(std::vector<double> row) { fRows.push_back(std::move(row)); }

    bool HasNext() override
    {
        ++fNumHasNext;
        return fNextRow < fRows.size();
    }

    const MCCommon::Record* Next() override
    {
        ++fNumNext;
        if (fBeforeNext)
            fBeforeNext(fNextRow);
        const std::vector<double>& row = fRows[fNextRow++];
        fRecord = MCCommon::Record(static_cast<int>(row.size()));
        for (std::size_t i = 0; i < row.size(); ++i) fRecord[static_cast<int>(i)] = row[i];
        return row.empty() ? nullptr : &fRecord; // an empty row stands for nothing to work on
    }

    std::vector<std::vector<double>> fRows;
    std::function<void(std::size_t)> fBeforeNext;
    int fNumHasNext = 0;
    int fNumNext = 0;

private:
    std::size_t fNextRow = 0;
    MCCommon::Record fRecord{0};
};

/// Cancels once it has been asked `asksUntilYes` times, and then says no again.
class CancelAfter : public MCQueryCancel
{
public:
    explicit CancelAfter(int asksUntilYes) : fAsksUntilYes(asksUntilYes) {}
    bool QueryCancel() override { return ++fNumAsked == fAsksUntilYes; }

    int fAsksUntilYes;
    int fNumAsked = 0;
};

/// Keeps the indices that were reported.
class ReportLog : public ProgressListener
{
public:
    void ReportProgress(ProgressReport& report) override
    {
        fIndices.push_back(report.DiscreteMeasure("IndexVar"));
        fSeconds.push_back(report.ScaleMeasure("elapsedTime"));
    }

    std::vector<int> fIndices;
    std::vector<double> fSeconds;
};

/// Numbers for random tests. Only the engine's raw output is used, so a seed gives the same data with every library.
class Dice
{
public:
    explicit Dice(unsigned int seed) : fEngine(seed) {}

    int Below(int limit) { return static_cast<int>(fEngine() % static_cast<unsigned int>(limit)); }
    double Fraction() { return static_cast<double>(fEngine()) / 4294967296.0; }

    template<class Element>
    void Shuffle(std::vector<Element>& elements)
    {
        for (std::size_t i = elements.size(); i > 1; --i)
            std::swap(elements[i - 1], elements[static_cast<std::size_t>(Below(static_cast<int>(i)))]);
    }

private:
    std::mt19937 fEngine;
};

#endif
