#include "hosts/python/src/binsbinding.h"

#include "bins/bins.h"
#include "bins/csv.h"
#include "bins/edit.h"
#include "bins/encoding.h"
#include "bins/gather.h"
#include "bins/json.h"
#include "bins/jsonbuilder.h"
#include "bins/jsonnames.h"
#include "bins/labels.h"
#include "bins/lookup.h"
#include "bins/measures.h"
#include "bins/numbers.h"
#include "bins/rows.h"
#include "bins/run.h"
#include "bins/sql.h"
#include "bins/text.h"
#include "bins/words.h"
#include "hosts/python/src/arrays.h"
#include "hosts/python/src/rowtuples.h"

#include <nanobind/ndarray.h>
#include <nanobind/stl/optional.h>
#include <nanobind/stl/pair.h>
#include <nanobind/stl/string.h>
#include <nanobind/stl/vector.h>

#include <algorithm>
#include <cmath>
#include <limits>
#include <optional>
#include <stdexcept>
#include <string>
#include <utility>
#include <vector>

namespace nb = nanobind;
using namespace nb::literals;

namespace
{

/// NaN stands for a figure that was not found.
double ToNumber(const std::optional<double>& figure)
{
    return figure.value_or(std::numeric_limits<double>::quiet_NaN());
}

nb::tuple ToTuple(const MCBinning::MCStatus& status)
{
    return nb::make_tuple(
        status.GetErrorCode(), GetSeverity(status),
        nb::make_tuple(status.GetDiscreteDatum(0), status.GetDiscreteDatum(1), status.GetDiscreteDatum(2)),
        nb::make_tuple(status.GetScaleDatum(0), status.GetScaleDatum(1), status.GetScaleDatum(2)));
}

std::vector<double> GetCategoryNumbers(const Variable& variable)
{
    std::vector<double> numbers;
    for (const std::string& category : variable.categories) numbers.push_back(ParseNumberOrNaN(category));
    return numbers;
}

/// A list of texts or numbers, or None.
nb::object GetCategories(const Variable& variable)
{
    if (!variable.IsCategorical())
        return nb::none();
    return variable.kind == VariableKind::kStringCategorical ? nb::cast(variable.categories)
                                                             : nb::cast(GetCategoryNumbers(variable));
}

/// What the values are: numbers that are categories are of type "integer" if all are whole.
const char* GetKind(const Variable& variable)
{
    if (variable.kind == VariableKind::kStringCategorical)
        return "text";
    if (const char* const kind = GetName(kValueKindNames, variable.valueKind))
        return kind;
    const std::vector<double> numbers = GetCategoryNumbers(variable);
    const auto isWhole = [](double number) { return number == std::floor(number) && std::isfinite(number); };
    return !numbers.empty() && std::all_of(numbers.begin(), numbers.end(), isWhole) ? "integer" : "float";
}

/// Of each bin the figure that `get` gives.
template<class Element, class Get>
nb::object Collect(const std::vector<Element>& elements, Get get)
{
    std::vector<double> numbers;
    numbers.reserve(elements.size());
    for (const Element& element : elements) numbers.push_back(get(element));
    return ToArray(std::move(numbers));
}

/// Of each bin a row with a weight for each category, or None without a target.
nb::object GetTargetWeights(const AttributeBins& bins)
{
    if (!bins.target)
        return nb::none();
    std::vector<double> flat;
    for (const Bin& bin : bins.bins) flat.insert(flat.end(), bin.weights.begin(), bin.weights.end());
    return ToArray(std::move(flat), std::max<std::size_t>(bins.target->categories.size(), 1));
}

/// Of the event, or of the only one that there can be; None where there is no evidence.
nb::object GetEvidence(const AttributeBins& bins, double Evidence::*figure)
{
    std::vector<Evidence> evidence = ComputeEvidence(bins);
    if (evidence.empty())
        return nb::none();
    evidence.resize(bins.bins.size()); // without that of the missing
    return Collect(evidence, [figure](const Evidence& ofBin) { return ofBin.*figure; });
}

/// By category of the target.
std::vector<double> GetInformationValues(const AttributeBins& bins)
{
    std::vector<double> values;
    const std::size_t numCategories = bins.target ? bins.target->categories.size() : 0;
    for (std::size_t code = 0; code < numCategories; ++code)
        values.push_back(ToNumber(ComputeInformationValue(bins, code)));
    return values;
}

nb::list GetRows(const AttributeBins& bins)
{
    nb::list rows;
    for (const BinRow& row : MakeRows(bins)) rows.append(ToTuple(row));
    return rows;
}

/// The bins as the only result of a run, of which nothing else is known.
Bins MakeAlone(const AttributeBins& bins)
{
    Bins alone;
    alone.settings.isRightClosed = bins.isRightClosed;
    alone.settings.smoothing = bins.smoothing;
    alone.variables.push_back(bins.attribute);
    if (bins.target)
        alone.variables.push_back(bins.target);
    else
        alone.settings.method = Method::kEqualFrequency;
    alone.results.push_back(bins);
    return alone;
}

/// Objects come as tuples of pairs, as a text may name a member twice.
void Build(JsonBuilder& builder, nb::handle value)
{
    std::int64_t whole = 0;
    if (value.is_none())
        builder.AddNull();
    else if (nb::isinstance<nb::bool_>(value))
        builder.AddBoolean(nb::cast<bool>(value));
    else if (nb::isinstance<nb::int_>(value) && nb::try_cast(value, whole))
        builder.AddInteger(whole);
    else if (nb::isinstance<nb::int_>(value) || nb::isinstance<nb::float_>(value))
        builder.AddNumber(nb::cast<double>(nb::float_(value)));
    else if (nb::isinstance<nb::str>(value))
        builder.AddString(nb::cast<std::string>(value));
    else if (nb::isinstance<nb::list>(value))
    {
        builder.BeginArray();
        for (nb::handle element : value) Build(builder, element);
        builder.End();
    }
    else
    {
        builder.BeginObject();
        for (nb::handle member : nb::cast<nb::tuple>(value))
        {
            builder.AddKey(nb::cast<std::string>(member[0]));
            Build(builder, member[1]);
        }
        builder.End();
    }
}

/// \throw nb::value_error which tells what is wrong with the document of this name.
Bins ReadDocument(nb::handle document, const std::string& name)
{
    try
    {
        JsonBuilder builder;
        Build(builder, document);
        return ReadBins(builder.GetValue());
    }
    catch (const JsonFault& fault)
    {
        throw nb::value_error((name + ": " + fault.what()).c_str());
    }
}

/// \throw std::invalid_argument if there is no such encoding.
Encoding FindEncoding(const std::string& wanted)
{
    for (const auto& [name, encoding] : kEncodingNames)
    {
        if (wanted == name)
            return encoding;
    }
    throw std::invalid_argument("encode must be 'number', 'label', 'woe' or 'rate', not " + Quote(wanted));
}

std::string WriteSql(const Bins& bins, bool isDuckDb, const std::string& encode, bool isCast, const std::string& table)
{
    return ToSql(bins, {isDuckDb ? SqlDialect::kDuckDb : SqlDialect::kStandard, FindEncoding(encode), isCast, table});
}

/// The expression of one result, which gives the codes: by bin, and behind them that of a missing value.
std::string WriteCase(const Bins& bins, std::size_t index, std::vector<double> codes, bool isDuckDb, bool isCast)
{
    Codes given;
    given.missing = codes.back();
    codes.pop_back();
    given.bins = std::move(codes);
    const SqlDialect dialect = isDuckDb ? SqlDialect::kDuckDb : SqlDialect::kStandard;
    return ToSql(bins.results.at(index), given, {dialect, Encoding::kNumber, isCast, ""}, bins.missingTexts);
}

/// By bin, and behind them of a missing value; NaN where that has none.
nb::object GetCodes(const AttributeBins& bins, const std::string& encode)
{
    Codes codes = MakeCodes(bins, FindEncoding(encode));
    codes.bins.push_back(ToNumber(codes.missing));
    return ToArray(std::move(codes.bins));
}

/// Of each column of bins the index of its result, and its name.
std::vector<std::pair<std::size_t, std::string>> GetBinColumns(const Bins& bins, const std::vector<std::string>& taken,
                                                               const std::string& encode)
{
    std::vector<std::pair<std::size_t, std::string>> columns;
    for (const BinColumn& column : MakeBinColumns(bins, taken, FindEncoding(encode)))
        columns.emplace_back(static_cast<std::size_t>(column.bins - bins.results.data()), column.name);
    return columns;
}

std::vector<Variable> GetVariables(const Bins& bins)
{
    std::vector<Variable> variables;
    for (const auto& variable : bins.variables) variables.push_back(*variable);
    return variables;
}

void BindVariable(nb::module_& module)
{
    nb::class_<Variable>(module, "Variable")
        .def_ro("name", &Variable::name)
        .def_ro("label", &Variable::label)
        .def_prop_ro("role", [](const Variable& self) { return GetName(kRoleNames, self.role); })
        .def_prop_ro("kind", &GetKind)
        .def_ro("time_zone", &Variable::timeZone)
        .def_prop_ro("categories", &GetCategories)
        .def_prop_ro("category_order",
                     [](const Variable& self)
                     {
                         return self.categoryOrder
                                    ? std::optional<std::string>(GetName(kCategoryOrderNames, *self.categoryOrder))
                                    : std::nullopt;
                     })
        .def_prop_ro("rare_code",
                     [](const Variable& self) { return self.rare ? std::optional(self.rare->code) : std::nullopt; })
        .def_prop_ro("rare", [](const Variable& self)
                     { return self.rare ? self.rare->categories : std::vector<std::string>(); })
        .def_prop_ro("order_target", [](const Variable& self)
                     { return self.orderTarget.empty() ? std::nullopt : std::optional(self.orderTarget); })
        .def_prop_ro("rounding",
                     [](const Variable& self) {
                         return self.role == VariableRole::kWeight ? std::optional<std::string>(GetName(self.rounding))
                                                                   : std::nullopt;
                     })
        .def_prop_ro("weight_scale", [](const Variable& self) { return GetName(kScaleNames, self.isScaledToRecords); })
        .def_ro("grid", &Variable::weightGrid)
        .def_ro("missing_texts", &Variable::missingTexts)
        .def_ro("missing_numbers", &Variable::missingNumbers)
        .def_ro("missing_interval", &Variable::missingInterval);
}

void BindAttributeBins(nb::module_& module)
{
    using Self = const AttributeBins&;
    nb::class_<AttributeBins>(module, "AttributeBins")
        .def_prop_ro("variable", [](Self self) { return *self.attribute; })
        .def_prop_ro("target",
                     [](Self self) { return self.target ? std::optional<Variable>(*self.target) : std::nullopt; })
        .def_prop_ro("status", [](Self self) { return ToTuple(self.status); })
        .def_ro("right_closed", &AttributeBins::isRightClosed)
        .def_prop_ro("cut_points", [](Self self) { return ToArray(self.cutPoints); })
        .def_prop_ro("borders", [](Self self) { return ToArray(MakeBorders(self)); })
        .def_prop_ro("border_texts", &FormatBorders)
        .def_prop_ro("labels", &MakeLabels)
        .def_prop_ro("weights", [](Self self) { return Collect(self.bins, [](const Bin& bin) { return bin.weight; }); })
        .def_prop_ro("target_weights", &GetTargetWeights)
        .def_ro("n_distinct", &AttributeBins::numDistinct)
        .def_ro("weight", &AttributeBins::weight)
        .def_ro("weight_with_missing", &AttributeBins::weightWithMissing)
        .def_prop_ro("minimum", [](Self self) { return ToNumber(self.minimum); })
        .def_prop_ro("maximum", [](Self self) { return ToNumber(self.maximum); })
        .def_prop_ro("target_entropy", [](Self self) { return ToNumber(ComputeTargetEntropy(self)); })
        .def_prop_ro("model_entropy", [](Self self) { return ToNumber(self.modelEntropy); })
        .def_prop_ro("gain", [](Self self) { return ToNumber(ComputeGain(self)); })
        .def_prop_ro("rates", [](Self self) { return GetEvidence(self, &Evidence::rate); })
        .def_prop_ro("woe", [](Self self) { return GetEvidence(self, &Evidence::weightOfEvidence); })
        .def_prop_ro("iv", [](Self self) { return GetEvidence(self, &Evidence::informationValue); })
        .def_prop_ro("rows", &GetRows)
        .def_ro("smoothing", &AttributeBins::smoothing)
        .def_ro("edited", &AttributeBins::isEdited)
        .def_prop_ro("information_value", [](Self self) { return ToNumber(ComputeInformationValue(self)); })
        .def_prop_ro("information_values", &GetInformationValues)
        .def("find_bin", [](Self self, double value) { return FindBin(self.cutPoints, self.isRightClosed, value); })
        .def("codes", &GetCodes, "encode"_a)
        .def("alone", &MakeAlone)
        .def("by_category", &SplitByCategory);
}

/// The bins with some of the results alone, in the order of `indices`.
Bins SelectResults(const Bins& bins, const std::vector<std::size_t>& indices)
{
    Bins selected = bins;
    selected.results.clear();
    for (const std::size_t index : indices) selected.results.push_back(bins.results.at(index));
    if (!selected.reduction || selected.reduction->numGroups.empty())
        return selected;
    selected.reduction->numGroups.clear();
    for (const std::size_t index : indices)
        selected.reduction->numGroups.push_back(bins.reduction->numGroups.at(index));
    return selected;
}

Bins MergeResult(const Bins& bins, std::size_t index, std::size_t first, std::size_t last)
{
    return ReplaceResult(bins, index, MergeBins(bins.results.at(index), first, last));
}

/// Cut points that are a part of those there join bins, and keep their weights; others leave bins without weight.
Bins RecutResult(const Bins& bins, std::size_t index, const std::vector<double>& cutPoints)
{
    const AttributeBins& known = bins.results.at(index);
    std::vector<std::size_t> kept;
    for (const double cutPoint : cutPoints)
    {
        const auto found = std::find(known.cutPoints.begin(), known.cutPoints.end(), cutPoint);
        if (found != known.cutPoints.end())
            kept.push_back(static_cast<std::size_t>(found - known.cutPoints.begin()));
    }
    const AttributeBins recut = Recut(known, cutPoints); // refuses what is no list of cut points
    const bool isJoined = kept.size() == cutPoints.size() && known.HasBins();
    return ReplaceResult(bins, index, isJoined ? JoinBins(known, kept) : recut);
}

void BindReduction(nb::module_& module)
{
    nb::class_<Reduction>(module, "Reduction")
        .def(nb::init<std::string, std::string, std::int64_t, bool, std::vector<std::int64_t>>(), "engine"_a,
             "reason"_a, "queries"_a, "is_distinct_exact"_a, "groups"_a)
        .def_ro("engine", &Reduction::engine)
        .def_ro("reason", &Reduction::reason)
        .def_ro("queries", &Reduction::numQueries)
        .def_ro("is_distinct_exact", &Reduction::isDistinctExact)
        .def_ro("groups", &Reduction::numGroups);
}

} // namespace

void BindBins(nb::module_& module)
{
    BindVariable(module);
    BindAttributeBins(module);
    BindReduction(module);
    using Self = const Bins&;
    nb::class_<Bins>(module, "Bins")
        .def_static("read", &ReadDocument, "document"_a.none(), "name"_a)
        .def_ro("component_version", &Bins::componentVersion)
        .def_prop_ro("method", [](Self self) { return GetName(kMethodNames, self.settings.method); })
        .def_prop_ro("closed", [](Self self) { return GetName(kClosedNames, self.settings.isRightClosed); })
        .def_prop_ro("n_bins", [](Self self) { return self.settings.numBins; })
        .def_prop_ro("max_distinct", [](Self self) { return self.settings.maxDistinct; })
        .def_prop_ro("small_bin_ratio", [](Self self) { return self.settings.smallBinRatio; })
        .def_prop_ro("smoothing", [](Self self) { return self.settings.smoothing; })
        .def_prop_ro("round", [](Self self) { return GetName(kRoundNames, self.settings.areCutsRounded); })
        .def_ro("data_name", &Bins::dataName)
        .def_rw("records", &Bins::numRecords, nb::arg().none())
        .def_rw("records_without_weight", &Bins::numRecordsWithoutWeight, nb::arg().none())
        .def_rw("reduction", &Bins::reduction, nb::arg().none())
        .def_ro("missing_text", &Bins::missingTexts)
        .def_prop_ro("variables", &GetVariables)
        .def_prop_ro("status", [](Self self) { return ToTuple(self.status); })
        .def_ro("results", &Bins::results, nb::rv_policy::copy)
        .def("set_border_texts", [](Bins& self, std::size_t index, std::vector<std::string> texts)
             { self.results.at(index).borderTexts = std::move(texts); })
        .def("set_weight_grid", &SetWeightGrid, "step"_a.none())
        .def("add_part", &AddPart, "part"_a, "attribute"_a, "target"_a, "n_distinct"_a.none() = nb::none())
        .def("select", &SelectResults, "indices"_a)
        .def("merge", &MergeResult, "index"_a, "first"_a, "last"_a)
        .def("recut", &RecutResult, "index"_a, "cut_points"_a)
        .def(
            "replace",
            [](Self self, std::size_t index, Self other, std::size_t otherIndex)
            { return ReplaceResult(self, index, other.results.at(otherIndex)); },
            "index"_a, "other"_a, "other_index"_a)
        .def("columns", &GetBinColumns, "taken"_a, "encode"_a)
        .def("to_json", &ToJson)
        .def("to_csv", &ToCsv)
        .def("to_case", &WriteCase, "index"_a, "codes"_a, "duckdb"_a, "cast"_a)
        .def("to_sql", &WriteSql, "duckdb"_a, "encode"_a, "cast"_a, "table"_a);
    module.def("describe_not_json", [](long line) { return std::string(MakeNotJson(line).what()); });
    module.def("status_words",
               [](int code, bool isWarning) { return GetStatusWords(MCBinning::MCStatus(code, isWarning)); });
}
