#include "bins/bins.h"

#include <limits>

void AttributeBins::AddBin(double ownWeight, std::vector<double> ownWeights)
{
    constexpr double kInfinity = std::numeric_limits<double>::infinity();
    const std::size_t index = bins.size();
    Bin bin;
    bin.left = index == 0 ? -kInfinity : cutPoints[index - 1];
    bin.right = index == cutPoints.size() ? kInfinity : cutPoints[index];
    bin.weight = ownWeight;
    bin.weights = std::move(ownWeights);
    bins.push_back(std::move(bin));
}
