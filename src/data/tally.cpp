#include "data/tally.h"

#include "base/makestatus.h"

#include <cstddef>

using MCBinning::MCStatus;

void TallyDistinct(const std::vector<BINSortTuple>& tuples, unsigned int numTuples, unsigned int numDistinct,
                   unsigned int numCategories, std::vector<double>& values, std::vector<double>& table)
{
    table.assign(std::size_t{numDistinct} * numCategories, 0.0);
    values.reserve(numDistinct);
    double* row = table.data();
    for (unsigned int i = 0; i < numTuples; ++i)
    {
        const BINSortTuple& tuple = tuples[i];
        if (values.empty() || tuple.fValue != values.back())
        {
            row = table.data() + values.size() * numCategories;
            values.push_back(tuple.fValue);
        }
        row[tuple.fTargetCode] += tuple.fWeight;
    }
}

MCStatus TallyBins(const std::vector<BINSortTuple>& tuples, unsigned int numTuples, unsigned int numCategories,
                   const std::vector<double>& cuts, bool rightBorderClosed, std::vector<double>& table)
{
    const MCStatus badTable = MakeWarning(MCBinning::BINStatusBadBinTable);
    if (cuts.empty())
        return badTable;
    const std::size_t numBins = cuts.size() - 1;
    table.assign(numBins * numCategories, 0.0);
    std::size_t bin = 0;
    for (unsigned int i = 0; i < numTuples; ++i)
    {
        const BINSortTuple& tuple = tuples[i];
        // The condition is negated so that a border that is not a number belongs to no bin.
        while (bin < numBins && !(rightBorderClosed ? tuple.fValue <= cuts[bin + 1] : tuple.fValue < cuts[bin + 1]))
        {
            ++bin;
        }
        if (bin == numBins)
            return badTable;
        table[bin * numCategories + tuple.fTargetCode] += tuple.fWeight;
    }
    return bin + 1 == numBins ? MCStatus() : badTable;
}
