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
    if (rows.front().evidence)
        total.evidence = Evidence{0.0, 0.0, 0.0};
    for (const BinRow& row : rows)
    {
        total.bin.weight += row.bin.weight;
        for (std::size_t code = 0; code < row.bin.weights.size(); ++code)
            total.bin.weights[code] += row.bin.weights[code];
        if (row.evidence)
            total.evidence->informationValue += row.evidence->informationValue;
    }
    if (total.evidence)
        total.evidence->rate = ComputeShare(total.bin.weights[1], total.bin.weight);
    return total;
}

} // namespace

std::vector<BinRow> MakeRows(const AttributeBins& bins)
{
    std::vector<BinRow> rows;
    if (!bins.HasBins())
        return rows;
    const std::vector<std::string> labels = MakeLabels(bins);
    for (std::size_t i = 0; i < bins.bins.size(); ++i)
        rows.push_back({BinRow::Kind::kBin, labels[i], bins.bins[i], 0.0, std::nullopt});
    if (HasMissing(bins))
        rows.push_back({BinRow::Kind::kMissing, "missing", *bins.missing, 0.0, std::nullopt});
    const std::vector<Evidence> evidence = ComputeEvidence(bins);
    for (std::size_t i = 0; i < evidence.size(); ++i) rows[i].evidence = evidence[i];
    rows.push_back(MakeTotal(rows));
    for (BinRow& row : rows) row.share = ComputeShare(row.bin.weight, rows.back().bin.weight);
    return rows;
}
