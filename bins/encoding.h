#ifndef MCOBNQRT_BINS_ENCODING_H
#define MCOBNQRT_BINS_ENCODING_H

#include "bins/bins.h"

#include <optional>
#include <string>
#include <utility>
#include <vector>

/// What stands for a value in new data.
enum class Encoding
{
    kNumber, ///< of its bin, from 0
    kLabel,  ///< of its bin
    kWeightOfEvidence,
    kRate ///< of the event in its bin
};

inline constexpr std::pair<const char*, Encoding> kEncodingNames[] = {{"number", Encoding::kNumber},
                                                                      {"label", Encoding::kLabel},
                                                                      {"woe", Encoding::kWeightOfEvidence},
                                                                      {"rate", Encoding::kRate}};

/// The numbers that stand for the values of one attribute.
struct Codes
{
    std::vector<double> bins;
    /// For a missing value, and for a category that the bins were made without. Nothing where these have no bin.
    std::optional<double> missing;
};

/// The numbers of an encoding that is not by labels.
///
/// Of weights of evidence and rates, a missing value has those of the missing, if these have weight. Otherwise it tells
/// nothing about the event: its weight of evidence is 0, and its rate that of all records.
/// \throw std::invalid_argument in words for the user if there is no weight of evidence: the target has not two
///        categories with weight.
Codes MakeCodes(const AttributeBins& bins, Encoding encoding);

/// What follows the name of the attribute in the name of a column: "bin", "woe" or "rate".
std::string GetSuffix(Encoding encoding);

#endif
