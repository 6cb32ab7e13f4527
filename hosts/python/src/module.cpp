// The module mcbinning._core: what the Python code of the package needs of the library, in Python's types and no more.

#include "bins/tempdirectory.h"
#include "hosts/python/src/binsbinding.h"
#include "hosts/python/src/capsules.h"
#include "hosts/python/src/columntype.h"
#include "hosts/python/src/evaluationbinding.h"
#include "hosts/python/src/faults.h"
#include "hosts/python/src/feed.h"

#include <nanobind/nanobind.h>
#include <nanobind/ndarray.h>
#include <nanobind/stl/optional.h>
#include <nanobind/stl/pair.h>
#include <nanobind/stl/string.h>
#include <nanobind/stl/tuple.h>
#include <nanobind/stl/vector.h>

#include <exception>
#include <optional>
#include <string>
#include <system_error>
#include <tuple>
#include <utility>
#include <vector>

namespace nb = nanobind;
using namespace nb::literals;

namespace
{

/// Bins the attributes; in a supervised run `targets` has that of each.
Bins BinFeed(Feed& feed, std::vector<int> attributes, std::optional<std::vector<int>> targets,
             std::optional<int> target, int numBins, std::optional<int> maxDistinct,
             std::optional<double> smallBinRatio, double smoothing, bool isRightClosed,
             const std::optional<std::string>& dataName, std::string tempDir, const nb::object& progress)
{
    const Method method = targets ? Method::kSupervised : Method::kEqualFrequency;
    RunRequest request{std::move(attributes), {}, target, std::move(tempDir)};
    if (targets)
        request.targets = std::move(*targets);
    return feed.Bin({method, isRightClosed, numBins, maxDistinct, smallBinRatio, smoothing}, request, dataName,
                    progress);
}

/// The bins that BinFeed() would give, without a result. `hasTargets` tells whether the run is supervised.
Bins DescribeFeed(const Feed& feed, bool hasTargets, std::optional<int> target, int numBins,
                  std::optional<int> maxDistinct, std::optional<double> smallBinRatio, double smoothing,
                  bool isRightClosed, const std::optional<std::string>& dataName)
{
    const Method method = hasTargets ? Method::kSupervised : Method::kEqualFrequency;
    return feed.Describe({method, isRightClosed, numBins, maxDistinct, smallBinRatio, smoothing}, target, dataName);
}

/// `counted` has of each result its index, the index of its attribute's field, and that of its target's or None.
Evaluation CountFeed(Feed& feed, Bins first,
                     const std::vector<std::tuple<std::size_t, std::size_t, std::optional<std::size_t>>>& counted,
                     const std::optional<std::string>& dataName, bool areGroups)
{
    std::vector<Counted> fields;
    fields.reserve(counted.size());
    for (const auto& [result, attribute, target] : counted) fields.push_back({result, attribute, target});
    return feed.Count(std::move(first), fields, dataName, areGroups);
}

/// The step of the grid of weights, of which so many are positive, as the product of two powers of two.
std::pair<double, double> GetGridFactors(std::int64_t numPositive, double largest)
{
    return WeightGrid({WeightRounding::kNone, numPositive, largest}).GetFactors();
}

/// A tuple for each column: name, kind of values, time zone, whether it can be used, and whether it is a dictionary that
/// declares the order of its values.
nb::list DescribeColumns(const Table& table)
{
    const ArrowSchema& schema = table.batches->GetSchema();
    nb::list columns;
    for (std::int64_t i = 0; i < schema.n_children; ++i)
    {
        const ColumnType type = ReadColumnType(*schema.children[i]);
        const char* const name = schema.children[i]->name;
        columns.append(nb::make_tuple(name != nullptr ? name : "", type.kind, type.timeZone,
                                      type.storage != ColumnType::Storage::kNone, type.isOrdered));
    }
    return columns;
}

/// Raises the package's class of that name.
template<class... Arguments>
void RaiseOwn(const char* name, Arguments&&... arguments)
{
    const nb::object type = nb::module_::import_("mcbinning._errors").attr(name);
    const nb::object error = type(std::forward<Arguments>(arguments)...);
    PyErr_SetObject(type.ptr(), error.ptr());
}

void TranslateFaults(const std::exception_ptr& exception, void*)
{
    try
    {
        std::rethrow_exception(exception);
    }
    catch (const DataFault& fault)
    {
        RaiseOwn("DataError", fault.what(), fault.GetColumn(), fault.GetRow());
    }
    catch (const StreamFault& fault)
    {
        RaiseOwn("StreamError", fault.what(), fault.GetRow());
    }
    catch (const std::system_error& error)
    {
        PyErr_SetObject(PyExc_OSError, nb::make_tuple(error.code().value(), error.what()).ptr());
    }
}

} // namespace

NB_MODULE(_core, module)
{
    nb::register_exception_translator(TranslateFaults);
    // To ask for that of the installed package would take as long as to import the module.
    module.attr("__version__") = MCBINNING_VERSION;
    // Raises a RuntimeError, with words for the user, where TMPDIR is set and can't be used.
    module.def("temp_directory", [](const std::string& named) { return ChooseTempDirectory(named, "temp_dir="); });
    module.def("grid_factors", &GetGridFactors, "positive"_a, "largest"_a);
    BindBins(module);
    BindEvaluation(module);

    module.def("describe_unusable", &DescribeUnusable, "categories"_a, "records"_a);
    nb::class_<CategoryCodes>(module, "CategoryCodes")
        .def(
            "__init__",
            [](CategoryCodes* self, std::vector<std::string> names) {
                new (self) CategoryCodes{std::move(names), std::nullopt, {}};
            },
            "names"_a)
        .def_ro("names", &CategoryCodes::names)
        .def_ro("rare_code", &CategoryCodes::rareCode)
        .def_ro("rare", &CategoryCodes::rare);

    nb::class_<Table>(module, "Table")
        .def_static(
            "from_stream",
            [](nb::capsule stream, nb::object explain)
            { return Table{OpenStream(std::move(stream), std::move(explain))}; },
            "stream"_a, "explain"_a.none() = nb::none())
        .def_static(
            "from_iterator",
            [](nb::capsule schema, nb::object iterator)
            { return Table{OpenIterator(std::move(schema), std::move(iterator))}; },
            "schema"_a, "iterator"_a)
        .def_prop_ro("columns", &DescribeColumns);

    nb::class_<Feed>(module, "Feed")
        .def(nb::init<nb::object>(), "table"_a.none())
        .def("add_field", &Feed::AddField, "name"_a, "use"_a, nb::kw_only(), "column"_a = -1,
             "array"_a.none() = nb::none(), "rounding"_a = "none", "scaled"_a = false, "optional"_a = false)
        .def("declare_missing", &Feed::DeclareMissing, "index"_a, "values"_a, "interval"_a.none(), "texts"_a)
        .def("set_categories", &Feed::SetCategories, "index"_a, "categories"_a, "unseen"_a = "changed")
        .def("describe_unusable", &Feed::DescribeUnusable, "index"_a)
        .def("drop", &Feed::Drop, "index"_a)
        .def("count_categories", &Feed::CountCategories, "pairs"_a, nb::kw_only(), "rare"_a, "by_rate"_a)
        .def("set_codes", &Feed::SetCodes, "index"_a, "codes"_a, nb::kw_only(), "rare"_a = 0.0, "order"_a,
             "target"_a = "")
        .def("set_unseen_code", &Feed::SetUnseenCode, "index"_a, "code"_a)
        .def("set_value_kind", &Feed::SetValueKind, "index"_a, "kind"_a)
        .def("categories", &Feed::GetCategories, "index"_a)
        .def("weights", &Feed::GetWeights)
        .def("set_weights", &Feed::SetWeights, "weights"_a, "scale"_a = 1.0)
        .def("scale_weights", &Feed::ScaleWeights)
        .def("learn", &Feed::Learn)
        .def("read", &Feed::Read, "max_rows"_a)
        .def("spool", &Feed::SpoolRecords, "directory"_a)
        .def("count", &CountFeed, "first"_a, "counted"_a, "data_name"_a.none(), "are_groups"_a = false)
        .def("describe", &DescribeFeed, nb::kw_only(), "has_targets"_a, "target"_a.none() = nb::none(), "n_bins"_a,
             "max_distinct"_a.none() = nb::none(), "small_bin_ratio"_a.none() = nb::none(),
             "smoothing"_a = Settings().smoothing, "right_closed"_a, "data_name"_a.none() = nb::none())
        .def("bin", &BinFeed, "attributes"_a, "targets"_a.none() = nb::none(), nb::kw_only(),
             "target"_a.none() = nb::none(), "n_bins"_a, "max_distinct"_a.none() = nb::none(),
             "small_bin_ratio"_a.none() = nb::none(), "smoothing"_a = Settings().smoothing, "right_closed"_a,
             "data_name"_a.none() = nb::none(), "temp_dir"_a, "progress"_a.none());
}
