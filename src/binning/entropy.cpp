#include "binning/entropy.h"

#include "platform/arithmetic.h"

#include <algorithm>
#include <cmath>
#include <cstddef>

namespace
{

/// A residual left by a subtraction counts as present: there is no tolerance.
int CountPresent(const CountVector& counts)
{
    return static_cast<int>(
        std::count_if(counts.begin() + 1, counts.end(), [](double weight) { return weight != 0.0; }));
}

} // namespace

double Log2(double x)
{
    static const double kLn2 = std::log(2.0);
    return std::log(x) / kLn2;
}

double Entropy(const CountVector& counts)
{
    if (counts[0] == 0.0)
        return 0.0;
    double entropy = 0.0;
    for (std::size_t category = 1; category < counts.size(); ++category)
    {
        const double share = counts[category] / counts[0];
        const double p = share == 0.0 ? 1.0 : share; // an absent category adds nothing
        entropy = -(Log2(p) * p) + entropy;
    }
    return entropy;
}

double PartitionEntropy(const CountVector& left, const CountVector& right)
{
    return (Entropy(left) * left[0] + Entropy(right) * right[0]) / (left[0] + right[0]);
}

double MDLDelta(const CountVector& left, const CountVector& right, double entropy)
{
    const int numLeft = CountPresent(left);
    const int numRight = CountPresent(right);
    const int numBoth = numLeft + numRight;
    const double saved = numBoth * entropy - Entropy(left) * numLeft - Entropy(right) * numRight;
    return Log2(std::pow(3.0, numBoth) - 2.0) - saved;
}
