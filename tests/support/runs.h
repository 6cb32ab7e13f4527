#ifndef MCOBNQRT_TESTS_RUNS_H
#define MCOBNQRT_TESTS_RUNS_H

#include "tests/support/hostdata.h"

#include <gtest/gtest.h>

#include <memory>
#include <utility>
#include <vector>

inline BINSettings SupervisedSettings()
{
    BINSettings settings;
    settings.SetNumberOfBins(10);
    return settings;
}

inline EFBINSettings EqualFrequencySettings(int numberOfBins)
{
    EFBINSettings settings;
    settings.SetNumberOfBins(numberOfBins);
    return settings;
}

/// An algorithm and what it has found: what both kinds of runs have in common.
template<class Algorithm, class Results>
class AlgorithmRun
{
public:
    AlgorithmRun() = default;
    explicit AlgorithmRun(std::unique_ptr<Algorithm> algorithm) : fAlgorithm(std::move(algorithm)) {}

    std::vector<Results> All()
    {
        std::vector<Results> results;
        fAlgorithm->GetOutput()->GetAllCutPoints(results);
        return results;
    }

    Algorithm* operator->() { return fAlgorithm.get(); }

protected:
    std::unique_ptr<Algorithm> fAlgorithm;
};

/// A supervised algorithm, made through its factory unless a test brings its own.
class Supervised : public AlgorithmRun<IBINAlgorithm, BINAttributeTargetResults>
{
public:
    explicit Supervised(BINVarList list, BINSettings settings = SupervisedSettings())
    {
        BINFactory factory;
        fAlgorithm.reset(factory.CreateBINAlgorithm(settings, list));
        EXPECT_NE(nullptr, fAlgorithm) << factory.GetStatus().GetErrorCode();
    }

    using AlgorithmRun::AlgorithmRun;

    MCBinning::MCStatus Run(IBINRecordSource& source) { return fAlgorithm->Run(&source, nullptr, nullptr); }

    MCBinning::MCStatus Run(IBINRecordSource& source, const std::vector<int>& attributes)
    {
        return fAlgorithm->Run(&source, &attributes, nullptr);
    }

    MCBinning::MCStatus Run(IBINRecordSource& source, const std::vector<int>& attributes,
                            const std::vector<int>& targets)
    {
        return fAlgorithm->Run(&source, &attributes, &targets);
    }

    BINAttributeTargetResults Pair(int attribute, int target)
    {
        BINAttributeTargetResults results;
        fAlgorithm->GetOutput()->GetAttributeTargetCutPoints(attribute, target, results);
        return results;
    }
};

/// An equal-frequency algorithm, made through its factory unless a test brings its own.
class EqualFrequency : public AlgorithmRun<IEFBINAlgorithm, BINAttributeResults>
{
public:
    EqualFrequency(BINVarList list, EFBINSettings settings)
    {
        EFBINFactory factory;
        fAlgorithm.reset(factory.CreateEFBINAlgorithm(settings, list));
        EXPECT_NE(nullptr, fAlgorithm) << factory.GetStatus().GetErrorCode();
    }

    using AlgorithmRun::AlgorithmRun;

    MCBinning::MCStatus Run(IBINRecordSource& source) { return fAlgorithm->Run(&source, nullptr); }

    MCBinning::MCStatus Run(IBINRecordSource& source, const std::vector<int>& attributes)
    {
        return fAlgorithm->Run(&source, &attributes);
    }

    BINAttributeResults Attribute(int attribute)
    {
        BINAttributeResults results;
        fAlgorithm->GetOutput()->GetAttributeCutPoints(attribute, results);
        return results;
    }
};

/// The code of a result, 0 for OK, made readable in a failure message.
template<class Results>
long CodeOf(const Results& results)
{
    return results.GetStatus().GetErrorCode();
}

inline void ExpectSame(const BINAttributeTargetResults& expected, const BINAttributeTargetResults& actual)
{
    EXPECT_EQ(expected.GetStatus(), actual.GetStatus());
    EXPECT_EQ(expected.GetCutPoints(), actual.GetCutPoints());
    EXPECT_EQ(expected.GetCellCounts(), actual.GetCellCounts());
    EXPECT_EQ(expected.GetNDistinctValues(), actual.GetNDistinctValues());
    EXPECT_EQ(expected.GetTotalWeight(), actual.GetTotalWeight());
    EXPECT_EQ(expected.GetTotalWeightWithMissing(), actual.GetTotalWeightWithMissing());
    EXPECT_EQ(expected.GetMinimum(), actual.GetMinimum());
    EXPECT_EQ(expected.GetMaximum(), actual.GetMaximum());
    EXPECT_EQ(expected.GetModelEntropy(), actual.GetModelEntropy());
}

inline void ExpectSame(const BINAttributeResults& expected, const BINAttributeResults& actual)
{
    EXPECT_EQ(expected.GetStatus(), actual.GetStatus());
    EXPECT_EQ(expected.GetCutPoints(), actual.GetCutPoints());
    EXPECT_EQ(expected.GetCellCounts(), actual.GetCellCounts());
    EXPECT_EQ(expected.GetNDistinctValues(), actual.GetNDistinctValues());
    EXPECT_EQ(expected.GetTotalWeight(), actual.GetTotalWeight());
    EXPECT_EQ(expected.GetTotalWeightWithMissing(), actual.GetTotalWeightWithMissing());
    EXPECT_EQ(expected.GetMinimum(), actual.GetMinimum());
    EXPECT_EQ(expected.GetMaximum(), actual.GetMaximum());
}

#endif
