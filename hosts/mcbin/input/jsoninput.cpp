#include "hosts/mcbin/input/jsoninput.h"

#include "bins/numbers.h"
#include "hosts/mcbin/failure.h"
#include "hosts/mcbin/input/inputfile.h"
#include "hosts/mcbin/output/jsonoutput.h"
#include "hosts/mcbin/text.h"

#include <fmt/format.h>
#include <nlohmann/json.hpp>

#include <algorithm>
#include <limits>
#include <map>

namespace
{

using Json = nlohmann::json;

std::string ReadAll(const std::string& path)
{
    InputFile file(path);
    std::string text;
    for (;;)
    {
        constexpr std::size_t kBlockSize = 1 << 16;
        const std::size_t size = text.size();
        text.resize(size + kBlockSize);
        text.resize(size + file.Read(text.data() + size, kBlockSize));
        if (text.size() < size + kBlockSize)
            return text;
    }
}

double GetNumber(const Json& json)
{
    if (json.is_number())
        return json.get<double>();
    const auto text = json.get<std::string>();
    if (text == "inf" || text == "-inf")
        return (text == "inf" ? 1 : -1) * std::numeric_limits<double>::infinity();
    if (text == "nan")
        return std::numeric_limits<double>::quiet_NaN();
    throw Failure(Quote(text) + " stands where a number should be");
}

std::optional<double> GetFigure(const Json& json)
{
    return json.is_null() ? std::nullopt : std::optional(GetNumber(json));
}

/// Whole numbers are written without a point, and a conversion would be undefined for large ones.
long GetInteger(const Json& json)
{
    if (!json.is_number_integer())
        throw Failure(Quote(json.dump()) + " stands where a whole number should be");
    return json.get<long>();
}

/// What is no array would be gone through as one of a single element.
const Json& GetArray(const Json& json)
{
    if (!json.is_array())
        throw Failure(Quote(Shorten(json.dump())) + " stands where a list should be");
    return json;
}

std::vector<double> GetNumbers(const Json& json)
{
    std::vector<double> numbers;
    for (const Json& number : GetArray(json)) numbers.push_back(GetNumber(number));
    return numbers;
}

/// The one of `values` that is named, where the names are in the order of the values.
template<class Value>
Value Choose(const Json& json, std::initializer_list<std::pair<const char*, Value>> values)
{
    const auto name = json.get<std::string>();
    for (const auto& [known, value] : values)
        if (name == known)
            return value;
    throw Failure("it has " + Quote(name) + ", which is not known here");
}

SettingOptions GetSettings(const Json& json)
{
    const Json& settings = json.at("settings");
    SettingOptions made;
    made.method = Choose<Method>(json.at("method"),
                                 {{"supervised", Method::kSupervised}, {"equal-frequency", Method::kEqualFrequency}});
    made.isRightClosed = Choose<bool>(settings.at("closed"), {{"right", true}, {"left", false}});
    made.bins = settings.at("bins").is_null() ? 0 : static_cast<int>(GetInteger(settings.at("bins")));
    if (!settings.at("distinct_threshold").is_null())
        made.distinctThreshold = static_cast<int>(GetInteger(settings.at("distinct_threshold")));
    made.smallBins = GetFigure(settings.at("small_bins")).value_or(0.0);
    return made;
}

MCBinning::MCStatus GetStatus(const Json& json)
{
    const auto code = GetInteger(json.at("code"));
    MCBinning::MCStatus status;
    if (json.at("severity") != "ok")
        status = MCBinning::MCStatus(code, json.at("severity") == "warning");
    for (unsigned int i = 0; i < 3; ++i)
    {
        status.SetDiscreteDatum(i, GetInteger(json.at("discrete").at(i)));
        status.SetScaleDatum(i, GetNumber(json.at("scale").at(i)));
    }
    return status;
}

void SetCategories(Variable& variable, const Json& categories)
{
    if (variable.IsCategorical())
        for (const Json& category : GetArray(categories))
            variable.categories.push_back(category.is_string() ? category.get<std::string>()
                                                               : FormatNumber(category.get<double>()));
}

void SetMissing(Variable& variable, const Json& missing)
{
    for (const Json& value : GetArray(missing.at("values")))
    {
        if (variable.kind == VariableKind::kStringCategorical)
            variable.missingTexts.push_back(value.get<std::string>());
        else
            variable.missingNumbers.push_back(GetNumber(value));
    }
    for (const Json& text : GetArray(missing.at("texts"))) variable.missingTexts.push_back(text.get<std::string>());
    const Json& interval = missing.at("interval");
    if (!interval.is_null())
        variable.missingInterval = {GetNumber(interval.at(0)), GetNumber(interval.at(1))};
}

Variable GetVariable(const Json& json)
{
    Variable variable;
    variable.name = json.at("name").get<std::string>();
    variable.label = json.at("label").get<std::string>();
    variable.kind = Choose<VariableKind>(json.at("kind"), {{"continuous", VariableKind::kContinuous},
                                                           {"string-categorical", VariableKind::kStringCategorical},
                                                           {"numeric-categorical", VariableKind::kNumericCategorical},
                                                           {"weight", VariableKind::kWeight}});
    variable.role = Choose<VariableRole>(json.at("role"), {{"attribute", VariableRole::kAttribute},
                                                           {"target", VariableRole::kTarget},
                                                           {"weight", VariableRole::kWeight}});
    if (!json.at("rounding").is_null())
        variable.rounding = json.at("rounding").get<std::string>();
    // Not there in a file of an earlier release.
    variable.weightGrid = GetFigure(json.value("grid", Json()));
    SetCategories(variable, json.at("categories"));
    SetMissing(variable, json.at("missing"));
    return variable;
}

/// A weight may have the name of another variable, and no result is about it.
int FindVariable(const Findings& findings, const Json& name)
{
    for (std::size_t i = 0; i < findings.variables.size(); ++i)
        if (findings.variables[i].role != VariableRole::kWeight && name == findings.variables[i].name)
            return static_cast<int>(i);
    throw Failure("it has a result for a variable that it doesn't describe");
}

Bin GetBin(const Json& json)
{
    Bin bin;
    bin.left = GetNumber(json.at("left"));
    bin.right = GetNumber(json.at("right"));
    bin.weight = GetNumber(json.at("weight"));
    if (!json.at("weights").is_null())
        bin.weights = GetNumbers(json.at("weights"));
    return bin;
}

/// Whether the bins lie between the cut points, which so can't be NaN, and hold a weight for each category of the
/// target.
bool AreBetween(const std::vector<Bin>& bins, const std::vector<double>& cuts, std::size_t nCategories)
{
    constexpr double kInfinity = std::numeric_limits<double>::infinity();
    if (bins.empty())
        return cuts.empty();
    double left = -kInfinity;
    for (std::size_t i = 0; i < bins.size(); ++i)
    {
        const double right = i < cuts.size() ? cuts[i] : kInfinity;
        if (bins[i].left != left || bins[i].right != right || bins[i].weights.size() != nCategories)
            return false;
        left = right;
    }
    return bins.size() == cuts.size() + 1;
}

void ThrowIfInconsistent(const Findings& findings, const Result& result)
{
    const std::vector<double>& cuts = result.cutPoints;
    const Variable* const target = findings.FindTarget(result);
    const bool isAscending =
        std::adjacent_find(cuts.begin(), cuts.end(), [](double a, double b) { return !(a < b); }) == cuts.end();
    if (!isAscending || !AreBetween(result.bins, cuts, target ? target->categories.size() : 0))
        throw Failure("the bins of " + Quote(findings.GetAttribute(result).name) +
                      " don't fit its cut points or its target");
}

Result GetResult(const Findings& findings, const Json& json)
{
    Result result;
    result.attribute = FindVariable(findings, json.at("attribute"));
    if (!json.at("target").is_null())
        result.target = FindVariable(findings, json.at("target"));
    result.status = GetStatus(json.at("status"));
    result.distinctValues = GetInteger(json.at("distinct_values"));
    result.weight = GetNumber(json.at("weight"));
    result.weightWithMissing = GetNumber(json.at("weight_with_missing"));
    result.minimum = GetFigure(json.at("minimum"));
    result.maximum = GetFigure(json.at("maximum"));
    result.targetEntropy = GetFigure(json.at("target_entropy"));
    result.modelEntropy = GetFigure(json.at("model_entropy"));
    result.cutPoints = GetNumbers(json.at("cut_points"));
    for (const Json& bin : GetArray(json.at("bins"))) result.bins.push_back(GetBin(bin));
    ThrowIfInconsistent(findings, result);
    return result;
}

void PadWeights(Json& bins, std::size_t nCategories)
{
    for (Json& bin : bins)
    {
        Json& weights = bin.at("weights");
        while (weights.is_array() && weights.size() < nCategories) weights.push_back(0);
    }
}

/// Makes a document of version 1 one of version 2. In the former the missing texts of each column are among those of
/// all columns, and the bins lack the weights of the target's last categories if no record that counts is of them.
void Upgrade(Json& document)
{
    std::map<std::string, std::size_t> nCategories; // by the name of the variable
    for (Json& variable : document.at("variables"))
    {
        variable.at("missing")["texts"] = Json::array();
        if (variable.at("categories").is_array())
            nCategories[variable.at("name").get<std::string>()] = variable.at("categories").size();
    }
    for (Json& result : document.at("results"))
        if (result.at("target").is_string())
            PadWeights(result.at("bins"), nCategories[result.at("target").get<std::string>()]);
}

Findings GetFindings(Json json)
{
    if (!json.is_object() || json.value("schema", "") != kSchema)
        throw Failure("it is no file of bins, as --format json writes it");
    const long version = GetInteger(json.at("schema_version"));
    if (version < 1 || version > kSchemaVersion)
        throw Failure(
            fmt::format("it has schema version {}, and this tool knows versions up to {}", version, kSchemaVersion));
    if (version == 1)
        Upgrade(json);
    Findings findings;
    findings.componentVersion = json.at("component_version").get<std::string>();
    findings.settings = GetSettings(json);
    const Json& data = json.at("data");
    findings.dataName = data.at("name").is_null() ? "" : data.at("name").get<std::string>();
    if (!data.at("records").is_null())
        findings.records = GetInteger(data.at("records"));
    const Json withoutWeight = data.value("records_without_weight", Json()); // absent in version 1
    if (!withoutWeight.is_null())
        findings.recordsWithoutWeight = GetInteger(withoutWeight);
    findings.missingText = data.at("missing_text").get<std::vector<std::string>>();
    for (const Json& variable : GetArray(json.at("variables"))) findings.variables.push_back(GetVariable(variable));
    findings.status = GetStatus(json.at("status"));
    for (const Json& result : GetArray(json.at("results"))) findings.results.push_back(GetResult(findings, result));
    return findings;
}

} // namespace

Findings ReadJson(const std::string& path)
{
    try
    {
        return GetFindings(Json::parse(ReadAll(path)));
    }
    catch (const Json::exception& error) // not JSON, or a member is lacking or of another kind
    {
        const std::string words = error.what(); // begins with "[json.exception....] "
        throw Failure(path +
                      ": it is no file of bins, as --format json writes it: " + words.substr(words.find(']') + 2));
    }
    catch (const Failure& failure)
    {
        const std::string words = failure.what();
        throw words.rfind(path, 0) == 0 ? failure : Failure(path + ": " + words);
    }
}
