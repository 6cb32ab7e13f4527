#ifndef MCOBNQRT_TESTS_PLAINSPLIT_H
#define MCOBNQRT_TESTS_PLAINSPLIT_H

#include <cmath>
#include <limits>
#include <optional>
#include <set>
#include <vector>

/// The entropy split as it is told, without a thought for speed: recursive, every candidate's sides moved cell by cell
/// in the order in which the sums are defined, every logarithm worked out. It is what faster forms are held to, bit by
/// bit.
class PlainSplit
{
public:
    using Counts = std::vector<double>; ///< total, then one cell for each category

    PlainSplit(std::vector<double> values, std::vector<Counts> rows, bool rightBorderClosed)
        : fValues(std::move(values)), fRows(std::move(rows)), fRightBorderClosed(rightBorderClosed)
    {
    }

    std::set<double> CutPoints()
    {
        fCutPoints.clear();
        if (!fRows.empty())
            Split(0, static_cast<int>(fRows.size()) - 1);
        return fCutPoints;
    }

    static double Log2(double x) { return std::log(x) / std::log(2.0); }

    static double Entropy(const Counts& v)
    {
        double h = 0.0;
        for (std::size_t c = 1; v[0] != 0.0 && c < v.size(); ++c)
        {
            double p = v[c] / v[0];
            if (p == 0.0)
                p = 1.0;
            h = -(Log2(p) * p) + h;
        }
        return h;
    }

    static double PartitionEntropy(const Counts& l, const Counts& r)
    {
        return (Entropy(l) * l[0] + Entropy(r) * r[0]) / (l[0] + r[0]);
    }

private:
    struct Cut
    {
        int fRow;
        int fLastLeft;
        Counts fLeft;
        Counts fRight;
    };

    static int Present(const Counts& v)
    {
        int present = 0;
        for (std::size_t c = 1; c < v.size(); ++c) present += v[c] != 0.0 ? 1 : 0;
        return present;
    }

    static double Delta(const Counts& l, const Counts& r, double entropy)
    {
        const double kL = Present(l);
        const double kR = Present(r);
        const double k = kL + kR;
        double b = k * entropy;
        b = b - Entropy(l) * kL;
        b = b - Entropy(r) * kR;
        return Log2(std::pow(3.0, k) - 2.0) - b;
    }

    Counts Total(int first, int last) const
    {
        Counts total(fRows.front().size() + 1, 0.0);
        for (std::size_t c = 1; c < total.size(); ++c)
        {
            for (int row = first; row <= last; ++row) total[c] += fRows[static_cast<std::size_t>(row)][c - 1];
            total[0] += total[c];
        }
        return total;
    }

    bool SamePure(int upper) const
    {
        const Counts& a = fRows[static_cast<std::size_t>(upper)];
        const Counts& b = fRows[static_cast<std::size_t>(upper) + 1];
        int both = 0;
        int one = 0;
        for (std::size_t c = 0; c < a.size(); ++c)
        {
            both += a[c] != 0.0 && b[c] != 0.0 ? 1 : 0;
            one += (a[c] != 0.0) != (b[c] != 0.0) ? 1 : 0;
        }
        return both == 1 && one == 0;
    }

    std::optional<Cut> Best(int first, int last) const
    {
        const Counts totals = Total(first, last);
        Counts l(totals.size(), 0.0);
        Counts r = totals;
        std::optional<int> best;
        double bestEntropy = 0.0;
        int next = first;
        for (int i = first; i <= last; ++i)
        {
            if (!((i < last && !SamePure(i)) || (i > first && !SamePure(i - 1))))
                continue;
            const int lastLeft = fRightBorderClosed ? i : i - 1;
            for (std::size_t c = 1; c < l.size(); ++c)
            {
                for (int j = next; j <= lastLeft; ++j)
                {
                    const double cell = fRows[static_cast<std::size_t>(j)][c - 1];
                    l[0] += cell;
                    l[c] += cell;
                    r[0] -= cell;
                    r[c] -= cell;
                }
            }
            next = lastLeft + 1;
            const double w = PartitionEntropy(l, r);
            if (!best || bestEntropy > w)
            {
                best = i;
                bestEntropy = w;
            }
        }
        if (!best)
            return std::nullopt;

        const int lastLeft = fRightBorderClosed ? *best : *best - 1;
        const bool leftIsShorter = (first + last) * 0.5 >= *best;
        Counts summed = leftIsShorter ? Total(first, lastLeft) : Total(lastLeft + 1, last);
        Counts rest(totals.size());
        for (std::size_t c = 0; c < totals.size(); ++c) rest[c] = totals[c] - summed[c];
        return leftIsShorter ? Cut{*best, lastLeft, summed, rest} : Cut{*best, lastLeft, rest, summed};
    }

    void Split(int first, int last)
    {
        if (last <= first)
            return;
        const Counts totals = Total(first, last);
        const std::optional<Cut> cut = Best(first, last);
        if (!cut || cut->fLastLeft < first || cut->fLastLeft == last)
            return;
        const double entropy = Entropy(totals);
        const double n = totals[0];
        const double gain = entropy - PartitionEntropy(cut->fLeft, cut->fRight);
        const double threshold = (Log2(n - 1.0) / n) + (Delta(cut->fLeft, cut->fRight, entropy) / n);
        if (!(threshold < gain))
            return;
        fCutPoints.insert(fValues[static_cast<std::size_t>(cut->fRow)]);
        Split(first, cut->fLastLeft);
        Split(cut->fLastLeft + 1, last);
    }

    std::vector<double> fValues;
    std::vector<Counts> fRows;
    bool fRightBorderClosed;
    std::set<double> fCutPoints;
};

#endif
