#include "bins/rows.h"

#include "bins/labels.h"

#include <limits>
#include <utility>

namespace
{

/// The sum of all rows.
BinRow MakeTotal(const std::vector<BinRow>& rows)
{
    BinRow total;
    total.kind = BinRow::Kind::kTotal;
    total.label = "total";
    total.bin.weights.resize(rows.front().bin.weights.size());
    total.bin.left = total.bin.right = std::numeric_limits<double>::quiet_NaN();
    for (const BinRow& row : rows)
    {
        total.bin.weight += row.bin.weight;
        for (std::size_t code = 0; code < row.bin.weights.size(); ++code)
            total.bin.weights[code] += row.bin.weights[code];
    }
    return total;
}

/// Of the row of the total.
Evidence SumEvidence(const std::vector<Evidence>& evidence, const Bin& total, std::size_t event)
{
    Evidence sum{ComputeShare(total.weights[event], total.weight), 0.0, 0.0};
    for (const Evidence& one : evidence) sum.informationValue += one.informationValue;
    return sum;
}

/// Puts the evidence of the event, and that of the total, into the rows, where there is any.
template<class Put>
void FillEvidence(std::vector<BinRow>& rows, const AttributeBins& bins, std::size_t event, Put put)
{
    std::vector<Evidence> evidence = ComputeEvidence(bins, event);
    if (evidence.empty())
        return;
    evidence.push_back(SumEvidence(evidence, rows.back().bin, event));
    for (std::size_t i = 0; i < rows.size(); ++i) put(rows[i], evidence[i]);
}

void FillEvidence(std::vector<BinRow>& rows, const AttributeBins& bins)
{
    if (const std::optional<std::size_t> event = FindEvent(bins))
    {
        FillEvidence(rows, bins, *event, [](BinRow& row, const Evidence& evidence) { row.evidence = evidence; });
        return;
    }
    const std::size_t numCategories = bins.target ? bins.target->categories.size() : 0;
    for (BinRow& row : rows) row.evidenceByCategory.resize(numCategories);
    for (std::size_t code = 0; code < numCategories; ++code)
    {
        FillEvidence(rows, bins, code,
                     [code](BinRow& row, const Evidence& evidence) { row.evidenceByCategory[code] = evidence; });
    }
}

} // namespace

AttributeBins SplitByCategory(const AttributeBins& bins)
{
    constexpr double kInfinity = std::numeric_limits<double>::infinity();
    AttributeBins split = bins;
    split.cutPoints.clear();
    split.borderTexts.clear();
    split.bins = bins.categories;
    for (std::size_t code = 0; code < split.bins.size(); ++code)
    {
        // The cut point between two codes is the one that belongs to its bin.
        const double first = static_cast<double>(code) - (bins.isRightClosed ? 1.0 : 0.0);
        split.bins[code].left = code == 0 ? -kInfinity : first;
        split.bins[code].right = code + 1 == split.bins.size() ? kInfinity : first + 1.0;
        if (code > 0)
            split.cutPoints.push_back(first);
    }
    split.modelEntropy = ComputeModelEntropy(split);
    return split;
}

std::vector<BinRow> MakeRows(const AttributeBins& bins)
{
    std::vector<BinRow> rows;
    if (!bins.HasBins())
        return rows;
    const auto add = [&rows](BinRow::Kind kind, const std::string& label, const Bin& bin)
    {
        BinRow row;
        row.kind = kind;
        row.label = label;
        row.bin = bin;
        rows.push_back(std::move(row));
    };
    const std::vector<std::string> labels = MakeLabels(bins);
    for (std::size_t i = 0; i < bins.bins.size(); ++i) add(BinRow::Kind::kBin, labels[i], bins.bins[i]);
    if (HasMissing(bins))
        add(BinRow::Kind::kMissing, "missing", *bins.missing);
    rows.push_back(MakeTotal(rows));
    for (BinRow& row : rows) row.share = ComputeShare(row.bin.weight, rows.back().bin.weight);
    FillEvidence(rows, bins);
    return rows;
}
