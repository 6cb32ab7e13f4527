#ifndef MCOBNQRT_SAMPLEBINS_H
#define MCOBNQRT_SAMPLEBINS_H

#include "bins/bins.h"

#include <limits>
#include <memory>
#include <string>
#include <utility>
#include <vector>

inline std::shared_ptr<Variable> AVariable(const std::string& name, VariableKind kind = VariableKind::kContinuous,
                                           std::vector<std::string> categories = {})
{
    auto variable = std::make_shared<Variable>();
    variable->name = name;
    variable->kind = kind;
    variable->categories = std::move(categories);
    return variable;
}

/// Bins between the cut points, with these weights by category of the target or, without one, of each bin alone.
inline AttributeBins SomeBins(std::shared_ptr<const Variable> attribute, std::shared_ptr<const Variable> target,
                              const std::vector<double>& cutPoints, const std::vector<std::vector<double>>& weights,
                              bool isRightClosed = true)
{
    constexpr double kInfinity = std::numeric_limits<double>::infinity();
    AttributeBins bins;
    bins.attribute = std::move(attribute);
    bins.target = std::move(target);
    bins.isRightClosed = isRightClosed;
    bins.cutPoints = cutPoints;
    for (std::size_t i = 0; i < weights.size(); ++i)
    {
        Bin bin;
        bin.left = i == 0 ? -kInfinity : cutPoints[i - 1];
        bin.right = i == cutPoints.size() ? kInfinity : cutPoints[i];
        for (const double weight : weights[i]) bin.weight += weight;
        if (bins.target)
            bin.weights = weights[i];
        bins.weight += bin.weight;
        bins.bins.push_back(bin);
    }
    bins.weightWithMissing = bins.weight;
    return bins;
}

#endif
