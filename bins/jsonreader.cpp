#include "bins/edit.h"
#include "bins/json.h"
#include "bins/jsoncursor.h"
#include "bins/jsonnames.h"
#include "bins/numbers.h"

#include <algorithm>
#include <climits>
#include <limits>

namespace
{

/// Reads a document of version `version`, and gives what it holds as the latest version has it.
class Reader
{
public:
    Reader(std::int64_t version, Edits edits) : fVersion(version), fEdits(edits) {}

    Bins Read(const JsonCursor& document)
    {
        fBins.componentVersion = document.At("component_version").GetString();
        fBins.settings = ReadSettings(document.At("settings"));
        fBins.settings.method = document.At("method").Choose(kMethodNames);
        ReadData(document.At("data"));
        for (const JsonCursor& variable : document.At("variables").GetElements())
            fBins.variables.push_back(std::make_shared<const Variable>(ReadVariable(variable)));
        fBins.status = ReadStatus(document.At("status"));
        for (const JsonCursor& result : document.At("results").GetElements())
            fBins.results.push_back(ReadResult(result));
        if (const auto reduction = document.Find("reduction"))
            fBins.reduction = ReadReduction(*reduction);
        return std::move(fBins);
    }

private:
    Settings ReadSettings(const JsonCursor& json) const
    {
        const bool isOld = fVersion < 3;
        Settings settings;
        settings.isRightClosed = json.At("closed").Choose(kClosedNames);
        const JsonCursor numBins = json.At(isOld ? "bins" : "n_bins");
        settings.numBins = numBins.IsNull() ? 0 : ReadInt(numBins);
        const JsonCursor maxDistinct = json.At(isOld ? "distinct_threshold" : "max_distinct");
        if (!maxDistinct.IsNull())
            settings.maxDistinct = ReadInt(maxDistinct);
        settings.smallBinRatio = json.At(isOld ? "small_bins" : "small_bin_ratio").GetFigure();
        // Until there was smoothing, there was none.
        const auto smoothing = json.Find("smoothing");
        settings.smoothing = smoothing ? smoothing->GetNumber() : 0.0;
        if (const auto round = json.Find("round"); round && !round->IsNull())
            settings.areCutsRounded = round->Choose(kRoundNames);
        return settings;
    }

    void ReadData(const JsonCursor& json)
    {
        if (const auto name = json.Find("name"))
            fBins.dataName = name->GetString();
        if (const auto records = json.Find("records"))
            fBins.numRecords = records->GetInteger(0);
        if (const auto withoutWeight = json.Find("records_without_weight"))
            fBins.numRecordsWithoutWeight = withoutWeight->GetInteger(0);
        fBins.missingTexts = json.At("missing_text").GetStrings();
    }

    Variable ReadVariable(const JsonCursor& json) const
    {
        Variable variable;
        variable.name = json.At("name").GetString();
        variable.label = json.At("label").GetString();
        variable.kind = json.At("kind").Choose(kKindNames);
        variable.role = json.At("role").Choose(kRoleNames);
        ReadRounding(variable, json);
        ReadValueKind(variable, json);
        if (variable.IsCategorical())
        {
            ReadCategories(variable, json.At("categories"));
            ReadCategoryOrder(variable, json);
        }
        ReadMissing(variable, json.At("missing"));
        return variable;
    }

    static void ReadRounding(Variable& variable, const JsonCursor& json)
    {
        const JsonCursor name = json.At("rounding");
        if (!name.IsNull())
        {
            const std::optional<WeightRounding> rounding = FindWeightRounding(name.GetString());
            if (!rounding)
                name.Refuse(Quote(Shorten(name.GetString())) + " is not known here");
            variable.rounding = *rounding;
        }
        if (const auto scale = json.Find("scale"); scale && !scale->IsNull())
            variable.isScaledToRecords = scale->Choose(kScaleNames);
        if (const auto grid = json.Find("grid"))
            variable.weightGrid = grid->GetNumber();
    }

    /// Earlier versions tell plain numbers and texts apart, which needs no telling.
    void ReadValueKind(Variable& variable, const JsonCursor& json) const
    {
        constexpr const char* kPlain[] = {"float", "integer", "decimal", "text", "null"};
        const auto kind = json.Find("value_kind");
        const bool isPlain = !kind || (fVersion < 3 && std::find(std::begin(kPlain), std::end(kPlain),
                                                                 kind->GetString()) != std::end(kPlain));
        if (!isPlain)
            variable.valueKind = kind->Choose(kValueKindNames);
        if (const auto zone = json.Find("time_zone"))
            variable.timeZone = zone->GetString();
    }

    static void ReadCategories(Variable& variable, const JsonCursor& json)
    {
        for (const JsonCursor& category : json.GetElements())
        {
            variable.categories.push_back(variable.kind == VariableKind::kStringCategorical
                                              ? category.GetString()
                                              : FormatCategoryNumber(category.GetNumber()));
        }
    }

    static void ReadCategoryOrder(Variable& variable, const JsonCursor& json)
    {
        if (const auto order = json.Find("category_order"))
            variable.categoryOrder = order->Choose(kCategoryOrderNames);
        if (const auto target = json.Find("order_target"))
            variable.orderTarget = target->GetString();
        const auto rare = json.Find("rare");
        if (!rare)
            return;
        const auto last = static_cast<std::int64_t>(variable.categories.size()) - 1;
        variable.rare = RareCategories{static_cast<std::size_t>(rare->At("code").GetInteger(0, last)),
                                       rare->At("share").GetNumber(), rare->At("categories").GetStrings()};
    }

    void ReadMissing(Variable& variable, const JsonCursor& json) const
    {
        const JsonCursor values = json.At("values");
        if (variable.kind == VariableKind::kStringCategorical)
            variable.missingTexts = values.GetStrings();
        else
            variable.missingNumbers = values.GetNumbers();
        if (fVersion > 1)
        {
            for (const std::string& text : json.At("texts").GetStrings()) variable.missingTexts.push_back(text);
        }
        else if (variable.kind != VariableKind::kStringCategorical)
            AddMissingNumbers(variable);
        const JsonCursor interval = json.At("interval");
        if (interval.IsNull())
            return;
        const std::vector<double> ends = interval.GetNumbers();
        if (ends.size() != 2)
            interval.Refuse("an interval has two ends");
        variable.missingInterval = {ends[0], ends[1]};
    }

    /// In version 1 numbers among the texts that stand for a missing value in all columns are not declared as numbers,
    /// too.
    void AddMissingNumbers(Variable& variable) const
    {
        std::vector<double>& numbers = variable.missingNumbers;
        for (const std::string& text : fBins.missingTexts)
        {
            const std::optional<double> number = ParseNumber(text);
            if (number && std::find(numbers.begin(), numbers.end(), *number) == numbers.end())
                numbers.push_back(*number);
        }
    }

    static MCBinning::MCStatus ReadStatus(const JsonCursor& json)
    {
        constexpr std::pair<const char*, int> kSeverities[] = {{"ok", 0}, {"warning", 1}, {"error", -1}};
        const int severity = json.At("severity").Choose(kSeverities);
        const int code = ReadInt(json.At("code"));
        MCBinning::MCStatus status;
        if (severity != 0)
            status = MCBinning::MCStatus(code, severity > 0);
        const std::vector<JsonCursor> discrete = json.At("discrete").GetElements();
        const std::vector<double> scale = json.At("scale").GetNumbers();
        if (discrete.size() != 3 || scale.size() != 3)
            json.Refuse("a status has three slots of each kind");
        for (unsigned int slot = 0; slot < 3; ++slot)
        {
            status.SetDiscreteDatum(slot, ReadInt(discrete[slot]));
            status.SetScaleDatum(slot, scale[slot]);
        }
        return status;
    }

    AttributeBins ReadResult(const JsonCursor& json) const
    {
        AttributeBins result;
        result.isRightClosed = fBins.settings.isRightClosed;
        result.smoothing = fBins.settings.smoothing;
        result.attribute = FindVariable(json.At("attribute"));
        if (!json.At("target").IsNull())
            result.target = FindVariable(json.At("target"));
        result.status = ReadStatus(json.At("status"));
        if (const auto numDistinct = json.Find("distinct_values"))
            result.numDistinct = numDistinct->GetInteger(0);
        if (const auto edited = json.Find("edited"))
            result.isEdited = edited->GetBoolean();
        result.weight = json.At("weight").GetNumber();
        result.weightWithMissing = json.At("weight_with_missing").GetNumber();
        result.minimum = json.At("minimum").GetFigure();
        result.maximum = json.At("maximum").GetFigure();
        result.modelEntropy = json.At("model_entropy").GetFigure();
        result.cutPoints = json.At("cut_points").GetNumbers();
        for (const JsonCursor& bin : json.At("bins").GetElements()) result.bins.push_back(ReadBin(bin, result));
        RefuseUnlessRising(json, result);
        if (fEdits == Edits::kRecut && !result.bins.empty() && !IsBetweenCutPoints(result))
            return Recut(result, result.cutPoints);
        RefuseIfInconsistent(json, result);
        if (const auto missing = json.Find("missing"))
            result.missing = ReadGroup(*missing, result);
        if (const auto categories = json.Find("categories"))
            ReadCategoryGroups(*categories, result);
        return result;
    }

    /// A weight may have the name of another variable, and no result is about it.
    std::shared_ptr<const Variable> FindVariable(const JsonCursor& name) const
    {
        for (const auto& variable : fBins.variables)
        {
            if (variable->role != VariableRole::kWeight && variable->name == name.GetString())
                return variable;
        }
        name.Refuse("there is no variable " + Quote(Shorten(name.GetString())));
    }

    Bin ReadBin(const JsonCursor& json, const AttributeBins& result) const
    {
        Bin bin;
        bin.left = json.At("left").GetNumber();
        bin.right = json.At("right").GetNumber();
        bin.weight = json.At("weight").GetNumber();
        const JsonCursor weights = json.At("weights");
        if (!weights.IsNull())
            bin.weights = weights.GetNumbers();
        // Version 1 leaves the last categories out if no record that counts is of them.
        if (fVersion == 1 && result.target)
            bin.weights.resize(std::max(bin.weights.size(), result.target->categories.size()));
        return bin;
    }

    static void RefuseUnlessByCategory(const JsonCursor& json, const Bin& bin, const AttributeBins& result)
    {
        if (bin.weights.size() != (result.target ? result.target->categories.size() : 0))
            json.At("weights").Refuse("there must be a weight for each category of the target");
    }

    /// Records without borders: those of a category, or without a value.
    static Bin ReadGroup(const JsonCursor& json, const AttributeBins& result)
    {
        Bin group;
        group.left = group.right = std::numeric_limits<double>::quiet_NaN();
        group.weight = json.At("weight").GetNumber();
        if (!json.At("weights").IsNull())
            group.weights = json.At("weights").GetNumbers();
        RefuseUnlessByCategory(json, group, result);
        return group;
    }

    static void ReadCategoryGroups(const JsonCursor& json, AttributeBins& result)
    {
        for (const JsonCursor& group : json.GetElements()) result.categories.push_back(ReadGroup(group, result));
        if (result.categories.size() != result.attribute->categories.size())
            json.Refuse("there must be one for each category of the attribute");
    }

    static void RefuseUnlessRising(const JsonCursor& json, const AttributeBins& result)
    {
        const std::vector<double>& cuts = result.cutPoints;
        const auto isNotBelow = [](double a, double b) { return !(a < b); };
        if (std::adjacent_find(cuts.begin(), cuts.end(), isNotBelow) != cuts.end())
            json.At("cut_points").Refuse("cut points must rise");
    }

    static bool IsBetweenCutPoints(const AttributeBins& result)
    {
        const std::vector<double>& cuts = result.cutPoints;
        if (result.bins.size() != cuts.size() + 1)
            return false;
        for (std::size_t i = 0; i < cuts.size(); ++i)
        {
            if (result.bins[i].right != cuts[i] || result.bins[i + 1].left != cuts[i])
                return false;
        }
        return true;
    }

    /// The bins lie between the cut points, which so can't be NaN, and hold a weight for each category of the target.
    static void RefuseIfInconsistent(const JsonCursor& json, const AttributeBins& result)
    {
        constexpr double kInfinity = std::numeric_limits<double>::infinity();
        const std::vector<double>& cuts = result.cutPoints;
        if (result.bins.size() != (result.bins.empty() && cuts.empty() ? 0 : cuts.size() + 1))
            json.At("bins").Refuse("there must be one bin more than there are cut points");
        const std::vector<JsonCursor> bins = json.At("bins").GetElements();
        double left = -kInfinity;
        for (std::size_t i = 0; i < bins.size(); ++i)
        {
            const double right = i < cuts.size() ? cuts[i] : kInfinity;
            if (result.bins[i].left != left || result.bins[i].right != right)
                bins[i].Refuse("the bin does not lie between its cut points");
            RefuseUnlessByCategory(bins[i], result.bins[i], result);
            left = right;
        }
    }

    Reduction ReadReduction(const JsonCursor& json) const
    {
        Reduction reduction;
        if (const auto engine = json.Find("engine"))
            reduction.engine = engine->GetString();
        if (const auto reason = json.Find("reason"))
            reduction.reason = reason->GetString();
        reduction.numQueries = json.At("queries").GetInteger(0);
        reduction.isDistinctExact = json.At("distinct").Choose(kDistinctNames);
        for (const JsonCursor& count : json.At("groups").GetElements())
            reduction.numGroups.push_back(count.GetInteger(0));
        if (!reduction.engine.empty() && reduction.numGroups.size() != fBins.results.size())
            json.At("groups").Refuse("there must be a number of groups for each result");
        return reduction;
    }

    static int ReadInt(const JsonCursor& json) { return static_cast<int>(json.GetInteger(INT_MIN, INT_MAX)); }

    std::int64_t fVersion;
    Edits fEdits;
    Bins fBins;
};

} // namespace

Bins ReadBins(const JsonValue& document, Edits edits)
{
    const JsonCursor cursor(document);
    const bool isObject = std::holds_alternative<JsonValue::Object>(document.held);
    const std::optional<JsonCursor> schema = isObject ? cursor.Find("schema") : std::nullopt;
    if (!schema || !schema->IsString() || schema->GetString() != kSchema)
        cursor.Refuse("this is not a document of bins");
    const std::int64_t version = cursor.At("schema_version").GetInteger();
    if (version < 1 || version > kSchemaVersion)
    {
        cursor.At("schema_version")
            .Refuse("version " + std::to_string(version) + " is not known here, but those up to " +
                    std::to_string(kSchemaVersion) + " are");
    }
    return Reader(version, edits).Read(cursor);
}

JsonFault MakeNotJson(long line)
{
    return JsonFault("line " + std::to_string(line) + ": this is not JSON");
}
