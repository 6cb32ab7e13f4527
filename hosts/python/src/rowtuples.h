#ifndef MCBINNING_ROWTUPLES_H
#define MCBINNING_ROWTUPLES_H

#include "bins/jsonnames.h"
#include "bins/rows.h"

#include <nanobind/nanobind.h>
#include <nanobind/stl/string.h>
#include <nanobind/stl/vector.h>

#include <optional>
#include <utility>

/// Rate, weight of evidence and information value, or None.
inline nanobind::object ToTuple(const std::optional<Evidence>& evidence)
{
    if (!evidence)
        return nanobind::none();
    return nanobind::make_tuple(evidence->rate, evidence->weightOfEvidence, evidence->informationValue);
}

/// Of a row of a table: what it is, its label, its borders, its weight, its share, its weight in each category, its
/// evidence, or None, and its evidence by category of a target of more than two.
inline nanobind::tuple ToTuple(const BinRow& row)
{
    nanobind::list byCategory;
    for (const std::optional<Evidence>& evidence : row.evidenceByCategory) byCategory.append(ToTuple(evidence));
    return nanobind::make_tuple(GetName(kRowNames, row.kind), row.label, row.bin.left, row.bin.right, row.bin.weight,
                                row.share, row.bin.weights, ToTuple(row.evidence), byCategory);
}

#endif
