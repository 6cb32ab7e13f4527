#include "bins/encoding.h"

#include "bins/rows.h"
#include "bins/text.h"

#include <stdexcept>

namespace
{

Codes MakeNumbers(const AttributeBins& bins)
{
    Codes codes;
    for (std::size_t i = 0; i < bins.bins.size(); ++i) codes.bins.push_back(static_cast<double>(i));
    return codes;
}

} // namespace

Codes MakeCodes(const AttributeBins& bins, Encoding encoding)
{
    if (encoding == Encoding::kNumber || encoding == Encoding::kLabel)
        return MakeNumbers(bins);
    const std::vector<BinRow> rows = MakeRows(bins);
    if (rows.empty() || !rows.front().evidence)
    {
        throw std::invalid_argument(Quote(bins.attribute->name) +
                                    " has neither weights of evidence nor rates, which are those of a target with two "
                                    "categories that both have weight");
    }
    const auto figure = encoding == Encoding::kRate ? &Evidence::rate : &Evidence::weightOfEvidence;
    Codes codes;
    codes.missing = (*rows.back().evidence).*figure; // the weight of evidence of all records is 0
    for (const BinRow& row : rows)
    {
        if (row.kind == BinRow::Kind::kBin)
            codes.bins.push_back((*row.evidence).*figure);
        else if (row.kind == BinRow::Kind::kMissing)
            codes.missing = (*row.evidence).*figure;
    }
    return codes;
}

std::string GetSuffix(Encoding encoding)
{
    switch (encoding)
    {
    case Encoding::kWeightOfEvidence:
        return "woe";
    case Encoding::kRate:
        return "rate";
    case Encoding::kNumber:
    case Encoding::kLabel:
        break;
    }
    return "bin";
}
