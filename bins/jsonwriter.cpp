#include "bins/json.h"
#include "bins/jsonnames.h"
#include "bins/jsonvalue.h"
#include "bins/measures.h"
#include "bins/numbers.h"
#include "bins/rows.h"
#include "bins/words.h"

#include <cmath>

namespace
{

using Array = JsonValue::Array;
using Object = JsonValue::Object;

/// A number as it stands in a list of categories or missing values.
JsonValue ToValue(const std::string& number)
{
    return ParseNumberOrNaN(number);
}

JsonValue ToValue(const Settings& settings)
{
    const bool isSupervised = settings.method == Method::kSupervised;
    Object object{{"closed", GetName(kClosedNames, settings.isRightClosed)},
                  {"n_bins", settings.numBins},
                  {"max_distinct", settings.maxDistinct},
                  {"small_bin_ratio", settings.smallBinRatio},
                  {"smoothing", isSupervised ? JsonValue(settings.smoothing) : JsonValue()}};
    if (settings.areCutsRounded)
        object.push_back({"round", GetName(kRoundNames, true)});
    return object;
}

JsonValue ToValue(const MCBinning::MCStatus& status)
{
    Array discrete;
    Array scale;
    for (unsigned int slot = 0; slot < 3; ++slot)
    {
        discrete.emplace_back(std::int64_t{status.GetDiscreteDatum(slot)});
        scale.emplace_back(status.GetScaleDatum(slot));
    }
    return Object{{"code", std::int64_t{status.GetErrorCode()}},
                  {"severity", GetSeverity(status)},
                  {"words", GetStatusWords(status)},
                  {"discrete", discrete},
                  {"scale", scale}};
}

JsonValue MakeCategories(const Variable& variable)
{
    if (!variable.IsCategorical())
        return {};
    if (variable.kind == VariableKind::kStringCategorical)
        return variable.categories;
    Array numbers;
    for (const std::string& category : variable.categories) numbers.push_back(ToValue(category));
    return numbers;
}

JsonValue MakeMissing(const Variable& variable)
{
    const bool areTexts = variable.kind == VariableKind::kStringCategorical;
    JsonValue interval;
    if (variable.missingInterval)
        interval = Array{variable.missingInterval->first, variable.missingInterval->second};
    return Object{{"values", areTexts ? JsonValue(variable.missingTexts) : JsonValue(variable.missingNumbers)},
                  {"texts", areTexts ? JsonValue(Array()) : JsonValue(variable.missingTexts)},
                  {"interval", interval}};
}

JsonValue MakeCategoryOrder(const Variable& variable)
{
    return variable.categoryOrder ? JsonValue(GetName(kCategoryOrderNames, *variable.categoryOrder)) : JsonValue();
}

JsonValue MakeRare(const Variable& variable)
{
    if (!variable.rare)
        return {};
    return Object{{"code", static_cast<std::int64_t>(variable.rare->code)},
                  {"share", variable.rare->share},
                  {"categories", variable.rare->categories}};
}

JsonValue ToValue(const Variable& variable)
{
    const bool isWeight = variable.role == VariableRole::kWeight;
    const char* const valueKind = GetName(kValueKindNames, variable.valueKind);
    Object object{{"name", variable.name},
                  {"label", variable.label},
                  {"kind", GetName(kKindNames, variable.kind)},
                  {"role", GetName(kRoleNames, variable.role)},
                  {"categories", MakeCategories(variable)},
                  {"category_order", MakeCategoryOrder(variable)},
                  {"order_target", variable.orderTarget.empty() ? JsonValue() : JsonValue(variable.orderTarget)},
                  {"rare", MakeRare(variable)},
                  {"rounding", isWeight ? JsonValue(GetName(variable.rounding)) : JsonValue()},
                  {"grid", variable.weightGrid},
                  {"missing", MakeMissing(variable)},
                  {"value_kind", valueKind ? JsonValue(valueKind) : JsonValue()},
                  {"time_zone", variable.timeZone}};
    if (variable.isScaledToRecords)
        object.push_back({"scale", GetName(kScaleNames, true)});
    return object;
}

JsonValue ToValue(const std::optional<Evidence>& evidence, double Evidence::*figure)
{
    return evidence ? JsonValue((*evidence).*figure) : JsonValue();
}

/// The figure of a row: one of a target of two categories, of one of more a list by category.
JsonValue MakeFigure(const BinRow& row, double Evidence::*figure)
{
    if (row.evidenceByCategory.empty())
        return ToValue(row.evidence, figure);
    Array figures;
    for (const std::optional<Evidence>& evidence : row.evidenceByCategory) figures.push_back(ToValue(evidence, figure));
    return figures;
}

/// What is said of a bin, or of the missing, behind its borders.
Object MakeGroup(const BinRow& row, const AttributeBins& bins)
{
    return Object{{"weight", row.bin.weight},
                  {"weights", bins.target ? JsonValue(row.bin.weights) : JsonValue()},
                  {"rate", MakeFigure(row, &Evidence::rate)},
                  {"woe", MakeFigure(row, &Evidence::weightOfEvidence)},
                  {"iv", MakeFigure(row, &Evidence::informationValue)}};
}

/// The missing that have no weight have no row.
BinRow MakeWeightless(const Bin& missing)
{
    BinRow row;
    row.bin = missing;
    return row;
}

/// What each category holds, by code; null where that is not known.
JsonValue MakeCategoryGroups(const AttributeBins& result)
{
    if (result.categories.empty())
        return {};
    const AttributeBins split = SplitByCategory(result);
    Array groups;
    for (const BinRow& row : MakeRows(split))
    {
        if (row.kind == BinRow::Kind::kBin)
            groups.emplace_back(MakeGroup(row, split));
    }
    return groups;
}

JsonValue ToValue(const AttributeBins& result)
{
    const std::vector<BinRow> rows = MakeRows(result);
    Array bins;
    JsonValue missing;
    if (result.missing)
        missing = MakeGroup(MakeWeightless(*result.missing), result);
    for (const BinRow& row : rows)
    {
        if (row.kind == BinRow::Kind::kMissing)
            missing = MakeGroup(row, result);
        if (row.kind != BinRow::Kind::kBin)
            continue;
        Object bin{{"left", row.bin.left}, {"right", row.bin.right}};
        for (JsonValue::Member& member : MakeGroup(row, result)) bin.push_back(std::move(member));
        bins.push_back(std::move(bin));
    }
    return Object{
        {"attribute", result.attribute->name},
        {"target", result.target ? JsonValue(result.target->name) : JsonValue()},
        {"status", ToValue(result.status)},
        {"edited", result.isEdited},
        {"distinct_values", result.numDistinct},
        {"weight", result.weight},
        {"weight_with_missing", result.weightWithMissing},
        {"minimum", result.minimum},
        {"maximum", result.maximum},
        {"target_entropy", ComputeTargetEntropy(result)},
        {"model_entropy", result.modelEntropy},
        {"information_value", rows.empty() ? JsonValue() : MakeFigure(rows.back(), &Evidence::informationValue)},
        {"cut_points", result.cutPoints},
        {"bins", bins},
        {"missing", missing},
        {"categories", MakeCategoryGroups(result)}};
}

JsonValue ToValue(const Reduction& reduction)
{
    const auto textOrNull = [](const std::string& text) { return text.empty() ? JsonValue() : JsonValue(text); };
    return Object{{"engine", textOrNull(reduction.engine)},
                  {"reason", textOrNull(reduction.reason)},
                  {"queries", reduction.numQueries},
                  {"distinct", GetName(kDistinctNames, reduction.isDistinctExact)},
                  {"groups", reduction.numGroups}};
}

} // namespace

JsonValue MakeDocument(const Bins& bins)
{
    Array variables;
    for (const auto& variable : bins.variables) variables.push_back(ToValue(*variable));
    Array results;
    for (const AttributeBins& result : bins.results) results.push_back(ToValue(result));
    return Object{{"schema", kSchema},
                  {"schema_version", kSchemaVersion},
                  {"component_version", bins.componentVersion},
                  {"method", GetName(kMethodNames, bins.settings.method)},
                  {"settings", ToValue(bins.settings)},
                  {"data", Object{{"name", bins.dataName},
                                  {"records", bins.numRecords},
                                  {"records_without_weight", bins.numRecordsWithoutWeight},
                                  {"missing_text", bins.missingTexts}}},
                  {"reduction", bins.reduction ? ToValue(*bins.reduction) : JsonValue()},
                  {"variables", variables},
                  {"status", ToValue(bins.status)},
                  {"results", results}};
}

std::string ToJson(const Bins& bins)
{
    return WriteJson(MakeDocument(bins));
}
