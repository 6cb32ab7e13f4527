#include "hosts/mcbin/output/jsonoutput.h"

#include "bins/numbers.h"
#include "bins/words.h"
#include "hosts/mcbin/findings.h"

#include <nlohmann/json.hpp>

#include <cmath>
#include <ostream>

namespace
{

using Json = nlohmann::ordered_json;

Json MakeNumber(double value)
{
    return std::isfinite(value) ? Json(value) : Json(std::isnan(value) ? "nan" : FormatNumber(value));
}

Json MakeFigure(const std::optional<double>& figure)
{
    return figure ? MakeNumber(*figure) : Json(nullptr);
}

Json MakeNumbers(const std::vector<double>& values)
{
    Json numbers = Json::array();
    for (const double value : values) numbers.push_back(MakeNumber(value));
    return numbers;
}

Json MakeSettings(const SettingOptions& settings)
{
    const bool isSupervised = settings.method == Method::kSupervised;
    Json json;
    json["closed"] = settings.isRightClosed ? "right" : "left";
    json["bins"] = settings.bins;
    json["distinct_threshold"] =
        isSupervised && settings.distinctThreshold >= 0 ? Json(settings.distinctThreshold) : Json(nullptr);
    json["small_bins"] = isSupervised ? MakeNumber(settings.smallBins) : Json(nullptr);
    return json;
}

Json MakeStatus(const MCBinning::MCStatus& status)
{
    Json json;
    json["code"] = status.GetErrorCode();
    json["severity"] = GetSeverity(status);
    json["words"] = GetStatusWords(status);
    json["discrete"] = Json::array();
    json["scale"] = Json::array();
    for (unsigned int i = 0; i < 3; ++i)
    {
        json["discrete"].push_back(status.GetDiscreteDatum(i));
        json["scale"].push_back(MakeNumber(status.GetScaleDatum(i)));
    }
    return json;
}

const char* GetKind(VariableKind kind)
{
    switch (kind)
    {
    case VariableKind::kContinuous:
        return "continuous";
    case VariableKind::kStringCategorical:
        return "string-categorical";
    case VariableKind::kNumericCategorical:
        return "numeric-categorical";
    case VariableKind::kWeight:
        return "weight";
    }
    return "";
}

const char* GetRole(VariableRole role)
{
    switch (role)
    {
    case VariableRole::kAttribute:
        return "attribute";
    case VariableRole::kTarget:
        return "target";
    case VariableRole::kWeight:
        return "weight";
    }
    return "";
}

Json MakeCategories(const Variable& variable)
{
    Json categories = Json::array();
    for (const std::string& category : variable.categories)
        categories.push_back(variable.kind == VariableKind::kNumericCategorical
                                 ? MakeNumber(ParseNumber(category).value_or(0.0))
                                 : Json(category));
    return variable.IsCategorical() ? categories : Json(nullptr);
}

Json MakeMissing(const Variable& variable)
{
    const bool areTexts = variable.kind == VariableKind::kStringCategorical;
    Json json;
    json["values"] = areTexts ? Json(variable.missingTexts) : MakeNumbers(variable.missingNumbers);
    json["texts"] = areTexts ? Json::array() : Json(variable.missingTexts);
    json["interval"] = nullptr;
    if (variable.missingInterval)
        json["interval"] = MakeNumbers({variable.missingInterval->first, variable.missingInterval->second});
    return json;
}

Json MakeVariable(const Variable& variable)
{
    Json json;
    json["name"] = variable.name;
    json["label"] = variable.label;
    json["kind"] = GetKind(variable.kind);
    json["role"] = GetRole(variable.role);
    json["categories"] = MakeCategories(variable);
    json["rounding"] = variable.role == VariableRole::kWeight ? Json(variable.rounding) : Json(nullptr);
    json["grid"] = MakeFigure(variable.weightGrid);
    json["missing"] = MakeMissing(variable);
    return json;
}

Json MakeBin(const Bin& bin, bool hasTarget)
{
    Json json;
    json["left"] = MakeNumber(bin.left);
    json["right"] = MakeNumber(bin.right);
    json["weight"] = MakeNumber(bin.weight);
    json["weights"] = hasTarget ? MakeNumbers(bin.weights) : Json(nullptr);
    return json;
}

Json MakeResult(const Findings& findings, const Result& result)
{
    const Variable* const target = findings.FindTarget(result);
    Json json;
    json["attribute"] = findings.GetAttribute(result).name;
    json["target"] = target ? Json(target->name) : Json(nullptr);
    json["status"] = MakeStatus(result.status);
    json["distinct_values"] = result.distinctValues;
    json["weight"] = MakeNumber(result.weight);
    json["weight_with_missing"] = MakeNumber(result.weightWithMissing);
    json["minimum"] = MakeFigure(result.minimum);
    json["maximum"] = MakeFigure(result.maximum);
    json["target_entropy"] = MakeFigure(result.targetEntropy);
    json["model_entropy"] = MakeFigure(result.modelEntropy);
    json["cut_points"] = MakeNumbers(result.cutPoints);
    json["bins"] = Json::array();
    for (const Bin& bin : result.bins) json["bins"].push_back(MakeBin(bin, target != nullptr));
    return json;
}

Json MakeJson(const Findings& findings)
{
    Json json;
    json["schema"] = kSchema;
    json["schema_version"] = kSchemaVersion;
    json["component_version"] = findings.componentVersion;
    json["method"] = findings.settings.method == Method::kSupervised ? "supervised" : "equal-frequency";
    json["settings"] = MakeSettings(findings.settings);
    json["data"]["name"] = findings.dataName;
    json["data"]["records"] = findings.records ? Json(*findings.records) : Json(nullptr);
    json["data"]["records_without_weight"] =
        findings.recordsWithoutWeight ? Json(*findings.recordsWithoutWeight) : Json(nullptr);
    json["data"]["missing_text"] = findings.missingText;
    json["variables"] = Json::array();
    for (const Variable& variable : findings.variables) json["variables"].push_back(MakeVariable(variable));
    json["status"] = MakeStatus(findings.status);
    json["results"] = Json::array();
    for (const Result& result : findings.results) json["results"].push_back(MakeResult(findings, result));
    return json;
}

bool IsFlat(const Json& json)
{
    for (const Json& element : json)
        if (element.is_object() || (element.is_structured() && !IsFlat(element)))
            return false;
    return true;
}

void Write(std::ostream& os, const Json& json, const std::string& indent);

void WriteElements(std::ostream& os, const Json& json, const std::string& separator, const std::string& indent)
{
    bool isFirst = true;
    for (const auto& item : json.items())
    {
        if (!isFirst)
            os << ',' << separator;
        isFirst = false;
        if (json.is_object())
            os << Json(item.key()).dump() << ": ";
        Write(os, item.value(), indent);
    }
}

/// The library's own output has a number of doubles with more digits than they need, and either no line ends or one
/// behind each number. An object or array that holds no other object stands on one line here.
void Write(std::ostream& os, const Json& json, const std::string& indent)
{
    if (json.is_number_float())
        os << FormatNumber(json.get<double>());
    else if (!json.is_structured())
        os << json.dump(-1, ' ', false, Json::error_handler_t::replace);
    else
    {
        const bool isFlat = IsFlat(json);
        const std::string deeper = indent + "  ";
        os << (json.is_object() ? '{' : '[') << (isFlat ? "" : "\n" + deeper);
        WriteElements(os, json, isFlat ? " " : "\n" + deeper, deeper);
        os << (isFlat ? "" : "\n" + indent) << (json.is_object() ? '}' : ']');
    }
}

} // namespace

void PrintJson(std::ostream& os, const Findings& findings)
{
    Write(os, MakeJson(findings), "");
    os << '\n';
}
