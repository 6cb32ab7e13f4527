#ifndef MCOBNQRT_TESTS_PLAINSPLIT_H
#define MCOBNQRT_TESTS_PLAINSPLIT_H

#include <cmath>
#include <limits>
#include <optional>
#include <set>
#include <vector>

/// The entropy split in its plain form, written for clarity and not for speed: recursive, every candidate's sides moved
/// cell by cell in the order in which the sums are defined, every logarithm worked out. It is what faster forms are
/// held to, bit by bit.
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
    struct Sides
    {
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

    int LastLeft(int row) const { return fRightBorderClosed ? row : row - 1; }

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

    bool IsInner(int row, int first, int last) const { return LastLeft(row) >= first && LastLeft(row) < last; }

    /// The candidate with the lowest partition entropy, none if there is no candidate.
    std::optional<int> BestRow(int first, int last, const Counts& totals, bool onlyInner) const
    {
        Counts l(totals.size(), 0.0);
        Counts r = totals;
        std::optional<int> best;
        double bestEntropy = 0.0;
        int next = first;
        for (int i = first; i <= last; ++i)
        {
            if (!((i < last && !SamePure(i)) || (i > first && !SamePure(i - 1))))
                continue;
            if (onlyInner && !IsInner(i, first, last))
                continue;
            for (std::size_t c = 1; c < l.size(); ++c)
            {
                for (int j = next; j <= LastLeft(i); ++j)
                {
                    const double cell = fRows[static_cast<std::size_t>(j)][c - 1];
                    l[0] += cell;
                    l[c] += cell;
                    r[0] -= cell;
                    r[c] -= cell;
                }
            }
            next = LastLeft(i) + 1;
            const double w = PartitionEntropy(l, r);
            if (!best || bestEntropy > w)
            {
                best = i;
                bestEntropy = w;
            }
        }
        return best;
    }

    /// The two sides of a cut at the row: the shorter one summed, the other what it leaves of the totals.
    Sides SidesOf(int row, int first, int last, const Counts& totals) const
    {
        const bool leftIsShorter = (first + last) * 0.5 >= row;
        Sides sides{totals, totals};
        Counts& summed = leftIsShorter ? sides.fLeft : sides.fRight;
        Counts& rest = leftIsShorter ? sides.fRight : sides.fLeft;
        summed = leftIsShorter ? Total(first, LastLeft(row)) : Total(LastLeft(row) + 1, last);
        for (std::size_t c = 0; c < totals.size(); ++c) rest[c] = totals[c] - summed[c];
        return sides;
    }

    void Split(int first, int last)
    {
        if (last <= first)
            return;
        const Counts totals = Total(first, last);
        std::optional<int> best = BestRow(first, last, totals, false);
        if (best && !IsInner(*best, first, last) && totals[0] < 2.0)
            best = BestRow(first, last, totals, true);
        if (!best || !IsInner(*best, first, last))
            return;
        const Sides sides = SidesOf(*best, first, last, totals);
        const double entropy = Entropy(totals);
        const double n = totals[0];
        const double gain = entropy - PartitionEntropy(sides.fLeft, sides.fRight);
        const double threshold = (Log2(n - 1.0) / n) + (Delta(sides.fLeft, sides.fRight, entropy) / n);
        if (!(threshold < gain))
            return;
        fCutPoints.insert(fValues[static_cast<std::size_t>(*best)]);
        Split(first, LastLeft(*best));
        Split(LastLeft(*best) + 1, last);
    }

    std::vector<double> fValues;
    std::vector<Counts> fRows;
    bool fRightBorderClosed;
    std::set<double> fCutPoints;
};

#endif
