#ifndef MCOBNQRT_TESTS_ALGORITHMPEER_H
#define MCOBNQRT_TESTS_ALGORITHMPEER_H

#include "binning/binalgorithm.h"

#include <set>
#include <vector>

/// Reaches the steps of a supervised algorithm that a host doesn't see.
class BINAlgorithmPeer
{
public:
    BINAlgorithmPeer(int numCategories, bool rightBorderClosed, const BINSettings& settings = BINSettings())
        : fAlgorithm(settings, BINVarList())
    {
        fAlgorithm.fNumTargetCategories = static_cast<unsigned int>(numCategories);
        fAlgorithm.fRightBorderClosed = rightBorderClosed;
    }

    std::set<double> CutPoints(const std::vector<double>& values, const std::vector<double>& table) const
    {
        std::set<double> cutPoints;
        fAlgorithm.FindCutPoints(&values, &table, 0, static_cast<int>(values.size()) - 1, cutPoints);
        return cutPoints;
    }

    void MergeSmallBins(std::vector<double>& cells, std::set<double>& cutPoints) const
    {
        fAlgorithm.MergeSmallBins(cells, cutPoints);
    }

    const BINAlgorithm& Algorithm() const { return fAlgorithm; }

private:
    BINAlgorithm fAlgorithm;
};

#endif
