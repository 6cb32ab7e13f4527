#ifndef MCOBNQRT_ENTROPY_H
#define MCOBNQRT_ENTROPY_H

#include <vector>

/// K + 1 doubles for K categories: the total weight, then the weight by target code. The total is taken as it stands.
using CountVector = std::vector<double>;

/// ln x / ln 2: minus infinity for 0 and NaN for a negative number, both of which are relied on.
double Log2(double x);

/// Entropy in bits: the sum of -p log2 p over the categories present; 0 without weight.
double Entropy(const CountVector& counts);

/// The entropies of the two sides, each with its share of the weight. NaN if both are without weight.
double PartitionEntropy(const CountVector& left, const CountVector& right);

/// Delta = log2(3^k - 2) - (k E(S) - kL E(L) - kR E(R)) with k = kL + kR, where kL and kR are the numbers of categories
/// present in the sides L and R, and `entropy` is that of the whole range, E(S).
double MDLDelta(const CountVector& left, const CountVector& right, double entropy);

#endif
