// The module mcbinning._core: what the Python code of the package needs of the library, in Python's types and no more.

#include "hosts/python/src/batches.h"
#include "hosts/python/src/calls.h"
#include "hosts/python/src/capsules.h"
#include "hosts/python/src/faults.h"
#include "hosts/python/src/libraryblocks.h"
#include "hosts/python/src/runs.h"
#include "hosts/python/src/spool.h"
#include "hosts/python/src/tableblocks.h"

#include "bins/tempdirectory.h"

#include <mcobnqrt/mcobnqrt.h>

#include <nanobind/nanobind.h>
#include <nanobind/ndarray.h>
#include <nanobind/stl/optional.h>
#include <nanobind/stl/pair.h>
#include <nanobind/stl/string.h>
#include <nanobind/stl/unique_ptr.h>
#include <nanobind/stl/vector.h>

#include <limits>
#include <memory>
#include <optional>
#include <string>
#include <system_error>
#include <utility>
#include <vector>

namespace nb = nanobind;
using namespace nb::literals;

namespace
{

using Array = nb::ndarray<nb::ro, nb::device::cpu, nb::ndim<1>>;
using Numbers = nb::ndarray<nb::numpy, double>;

struct Table
{
    std::unique_ptr<Batches> batches;
};

ColumnType::Storage StorageOf(const Array& array)
{
    using Storage = ColumnType::Storage;
    struct Type
    {
        nb::dlpack::dtype_code code;
        unsigned bits;
        Storage storage;
    };
    static constexpr Type kTypes[] = {
        {nb::dlpack::dtype_code::Float, 64, Storage::kDouble}, {nb::dlpack::dtype_code::Float, 32, Storage::kFloat},
        {nb::dlpack::dtype_code::Float, 16, Storage::kHalf},   {nb::dlpack::dtype_code::Int, 8, Storage::kInt8},
        {nb::dlpack::dtype_code::Int, 16, Storage::kInt16},    {nb::dlpack::dtype_code::Int, 32, Storage::kInt32},
        {nb::dlpack::dtype_code::Int, 64, Storage::kInt64},    {nb::dlpack::dtype_code::UInt, 8, Storage::kUint8},
        {nb::dlpack::dtype_code::UInt, 16, Storage::kUint16},  {nb::dlpack::dtype_code::UInt, 32, Storage::kUint32},
        {nb::dlpack::dtype_code::UInt, 64, Storage::kUint64},  {nb::dlpack::dtype_code::Bool, 8, Storage::kUint8},
    };
    for (const Type& type : kTypes)
    {
        if (array.dtype().code == static_cast<std::uint8_t>(type.code) && array.dtype().bits == type.bits)
            return type.storage;
    }
    return Storage::kNone;
}

Variable::Use UseOf(const std::string& use)
{
    if (use == "attribute")
        return Variable::Use::kAttribute;
    if (use == "category")
        return Variable::Use::kCategory;
    if (use == "code")
        return Variable::Use::kCode;
    if (use == "weight")
        return Variable::Use::kWeight;
    throw nb::value_error("no such use");
}

Variable::Unseen UnseenOf(const std::string& unseen)
{
    if (unseen == "changed")
        return Variable::Unseen::kChanged;
    if (unseen == "error")
        return Variable::Unseen::kError;
    if (unseen == "missing")
        return Variable::Unseen::kMissing;
    throw nb::value_error("no such treatment of unseen categories");
}

StridedArray Borrow(const Array& array, const std::string& name)
{
    const StridedArray borrowed{array.data(), array.stride(0) * (array.dtype().bits / 8), array.shape(0),
                                StorageOf(array)};
    if (borrowed.storage == ColumnType::Storage::kNone)
        throw DataFault("the array is not one of numbers", name);
    return borrowed;
}

/// Stops the reading of blocks at an interrupt, where no library asks.
class PolledBlocks : public BlockSource
{
public:
    explicit PolledBlocks(BlockSource& source) : fSource(source) {}

    bool Next(Block& block) override
    {
        fInterrupts.Poll();
        fInterrupts.Rethrow();
        return fSource.Next(block);
    }

private:
    BlockSource& fSource;
    Interrupts fInterrupts;
};

nb::tuple ToTuple(const MCBinning::MCStatus& status)
{
    const char* const severity = status.IsOK() ? "ok" : status.IsError() ? "error" : "warning";
    return nb::make_tuple(
        status.GetErrorCode(), severity,
        nb::make_tuple(status.GetDiscreteDatum(0), status.GetDiscreteDatum(1), status.GetDiscreteDatum(2)),
        nb::make_tuple(status.GetScaleDatum(0), status.GetScaleDatum(1), status.GetScaleDatum(2)));
}

/// A NumPy array of the numbers, which it owns: of rows of `numColumns`, or of one dimension with 0.
Numbers ToArray(std::vector<double> values, std::size_t numColumns)
{
    auto owned = std::make_unique<std::vector<double>>(std::move(values));
    double* const data = owned->data();
    const std::size_t size = owned->size();
    const nb::capsule owner(owned.get(), [](void* p) noexcept { delete static_cast<std::vector<double>*>(p); });
    owned.release(); // the capsule's now
    return numColumns == 0 ? Numbers(data, {size}, owner) : Numbers(data, {size / numColumns, numColumns}, owner);
}

/// Appends the values of a field to `values`.
void AppendWithNaN(const Variable& variable, Block& block, std::size_t field, std::vector<double>& values)
{
    const double* const source = block.GetField(field);
    const bool isCode = variable.use != Variable::Use::kAttribute;
    const bool hasUserMissing = variable.HasMissingNumbers();
    for (std::size_t i = 0; i < block.numRows; ++i)
    {
        const bool isMissing = isCode ? source[i] < 0.0
                                      : source[i] == MCMV::gMissingValue ||
                                            (hasUserMissing && variable.missingNumbers.Contains(source[i]));
        values.push_back(isMissing ? std::numeric_limits<double>::quiet_NaN() : source[i]);
    }
}

std::vector<double> Flatten(const std::vector<std::vector<double>>& rows)
{
    std::vector<double> flat;
    for (const std::vector<double>& row : rows) flat.insert(flat.end(), row.begin(), row.end());
    return flat;
}

/// A minimum or maximum, NaN where the library found none.
double ToExtreme(double value)
{
    return value == MCMV::gMissingValue ? std::numeric_limits<double>::quiet_NaN() : DecodeInfinity(value);
}

template<class Result>
nb::dict ToCommonDict(const Result& result, const InfiniteValues& values, bool isRightClosed)
{
    nb::dict dict;
    std::vector<double> cutPoints = result.GetCutPoints();
    for (double& cutPoint : cutPoints) cutPoint = values.DecodeCutPoint(cutPoint, isRightClosed);
    dict["status"] = ToTuple(result.GetStatus());
    dict["attribute"] = result.GetAttributeIndex();
    dict["cut_points"] = ToArray(std::move(cutPoints), 0);
    dict["n_distinct"] = result.GetNDistinctValues();
    dict["weight"] = result.GetTotalWeight();
    dict["weight_with_missing"] = result.GetTotalWeightWithMissing();
    dict["minimum"] = ToExtreme(result.GetMinimum());
    dict["maximum"] = ToExtreme(result.GetMaximum());
    return dict;
}

nb::dict ToDict(const BINAttributeTargetResults& result, const InfiniteValues& values, bool isRightClosed)
{
    nb::dict dict = ToCommonDict(result, values, isRightClosed);
    const auto& rows = result.GetCellCounts();
    dict["target"] = result.GetTargetIndex();
    dict["counts"] = ToArray(Flatten(rows), rows.empty() || rows[0].empty() ? 1 : rows[0].size());
    dict["model_entropy"] = result.GetModelEntropy();
    return dict;
}

nb::dict ToDict(const BINAttributeResults& result, const InfiniteValues& values, bool isRightClosed)
{
    nb::dict dict = ToCommonDict(result, values, isRightClosed);
    dict["counts"] = ToArray(result.GetCellCounts(), 1);
    return dict;
}

template<class Result>
nb::tuple ToTuple(const Outcome<Result>& outcome, const LibraryBlocks& blocks, bool isRightClosed)
{
    nb::list results;
    for (const Result& result : outcome.results)
    {
        const auto attribute = static_cast<std::size_t>(result.GetAttributeIndex());
        results.append(ToDict(result, blocks.GetValues().at(attribute), isRightClosed));
    }
    return nb::make_tuple(ToTuple(outcome.status), results, outcome.numRecords, outcome.version,
                          blocks.GetNumWithoutWeight(), blocks.GetWeightGrid().GetStep());
}

/// The records of one analysis: a table, arrays, or both side by side. A table can be read once, by one of the
/// operations that read records.
class Feed
{
public:
    /// \param table a Table, or None.
    explicit Feed(nb::object table) : fTable(std::move(table)) {}

    /// Its values are in a column of the table or in the array, which has one for each record.
    void AddVariable(const std::string& name, const std::string& use, int column, const std::optional<Array>& array,
                     int numCodes, const std::string& rounding)
    {
        Variable variable;
        variable.name = name;
        variable.use = UseOf(use);
        variable.column = array ? -1 : column;
        variable.numCodes = numCodes;
        variable.rounding = FindWeightRounding(rounding).value();
        if (array)
            variable.array = Borrow(*array, name);
        fVariables.push_back(std::move(variable));
        fArrays.push_back(array);
    }

    void DeclareMissing(std::size_t index, const std::vector<double>& values,
                        std::optional<std::pair<double, double>> interval, const std::vector<std::string>& texts)
    {
        Variable& variable = fVariables.at(index);
        for (const double value : values) variable.missingNumbers.AddValue(TellFromMissing(value), "");
        if (interval)
            variable.missingNumbers.SetInterval(BINNumericInterval(interval->first, interval->second));
        for (const std::string& text : texts) variable.missingTexts.AddValue(text, "");
    }

    /// Tells all categories that there will be, by code, and what another one is: "changed", "error" or "missing".
    void SetCategories(std::size_t index, nb::list categories, const std::string& unseen)
    {
        Variable& variable = fVariables.at(index);
        for (nb::handle category : categories)
        {
            if (nb::isinstance<nb::str>(category))
                variable.texts.Encode(nb::cast<std::string>(category));
            else
                variable.numbers.Encode(nb::cast<double>(category));
        }
        variable.isComplete = true;
        variable.unseen = UnseenOf(unseen);
    }

    /// The categories: by code where all have been told, else those known by now, in the order that their column
    /// declares or else in ascending order.
    nb::list GetCategories(std::size_t index) const
    {
        const Variable& variable = fVariables.at(index);
        nb::list categories;
        const auto append = [&](const auto& table)
        {
            for (const auto& key : variable.isComplete ? table.GetKeys() : table.GetSorted()) categories.append(key);
        };
        append(variable.texts);
        append(variable.numbers);
        return categories;
    }

    /// How many weights are above 0, and the largest. Known once the records have been read for it, and where they
    /// were read by another feed, from there.
    std::pair<std::int64_t, double> GetWeights() const
    {
        return {fWeights.value().numPositive, fWeights.value().largest};
    }

    void SetWeights(const std::pair<std::int64_t, double>& weights)
    {
        fWeights = WeightTally{WeightRounding::kNone, weights.first, weights.second};
    }

    /// Reads the records for their categories and weights alone.
    void Learn()
    {
        TableBlocks table(GetBatches(), fVariables);
        const nb::gil_scoped_release released;
        fWeights = Tally(table, fVariables);
    }

    /// Reads the records for their categories and weights, and keeps them in a nameless file for the run.
    void SpoolRecords(const std::string& directory)
    {
        TableBlocks table(GetBatches(), fVariables);
        const nb::gil_scoped_release released;
        PolledBlocks polled(table);
        TalliedBlocks blocks(polled, fVariables);
        fSpool = std::make_unique<Spool>(blocks, fVariables, directory);
        fWeights = blocks.GetTally();
    }

    /// The next records, `maxRows` or a few more: for each variable an array with its numbers or codes, NaN for what is
    /// missing. The arrays are empty at the end.
    nb::list Read(std::size_t maxRows)
    {
        if (!fReading)
            fReading.emplace(GetBatches(), fVariables);
        std::vector<std::vector<double>> fields(fVariables.size());
        {
            const nb::gil_scoped_release released;
            PolledBlocks blocks(*fReading);
            Block block(fVariables.size());
            std::size_t numRows = 0;
            for (; numRows < maxRows && blocks.Next(block); numRows += block.numRows)
                for (std::size_t i = 0; i < fields.size(); ++i) AppendWithNaN(fVariables[i], block, i, fields[i]);
        }
        nb::list arrays;
        for (std::vector<double>& field : fields) arrays.append(ToArray(std::move(field), 0));
        return arrays;
    }

    nb::tuple BinSupervised(const std::vector<int>& attributes, const std::vector<int>& targets, int numBins,
                            int maxDistinct, double smallBinRatio, bool isRightClosed, const std::string& tempDir,
                            nb::object progress)
    {
        const RunOptions options{numBins, maxDistinct, smallBinRatio, isRightClosed, tempDir};
        return Run(isRightClosed, [&](BlockSource& blocks, Interrupts& interrupts)
                   { return RunSupervised(blocks, fVariables, attributes, targets, options, progress, interrupts); });
    }

    nb::tuple BinEqualFrequency(const std::vector<int>& attributes, int numBins, bool isRightClosed,
                                const std::string& tempDir, nb::object progress)
    {
        const RunOptions options{numBins, 0, 0.0, isRightClosed, tempDir};
        return Run(isRightClosed, [&](BlockSource& blocks, Interrupts& interrupts)
                   { return RunEqualFrequency(blocks, fVariables, attributes, options, progress, interrupts); });
    }

private:
    Batches* GetBatches() const { return fTable.is_none() ? nullptr : nb::cast<Table&>(fTable).batches.get(); }

    static WeightTally Tally(BlockSource& source, const std::vector<Variable>& variables)
    {
        PolledBlocks polled(source);
        TalliedBlocks blocks(polled, variables);
        Block block(variables.size());
        while (blocks.Next(block)) continue;
        return blocks.GetTally();
    }

    /// An array of weights is at hand, and can be read at any time.
    void TallyArray()
    {
        const std::optional<std::size_t> index = FindWeight(fVariables);
        if (!index || fWeights)
            return;
        std::vector<Variable> weight(1);
        weight[0].name = fVariables[*index].name;
        weight[0].use = Variable::Use::kWeight;
        weight[0].array = fVariables[*index].array;
        weight[0].rounding = fVariables[*index].rounding;
        TableBlocks blocks(nullptr, weight);
        const nb::gil_scoped_release released;
        fWeights = Tally(blocks, weight);
    }

    template<class Function>
    nb::tuple Run(bool isRightClosed, Function function)
    {
        std::optional<TableBlocks> table;
        if (!fSpool)
            table.emplace(GetBatches(), fVariables);
        TallyArray();
        WeightTally tally = fWeights.value_or(WeightTally());
        if (const std::optional<std::size_t> index = FindWeight(fVariables))
            tally.rounding = fVariables[*index].rounding;
        LibraryBlocks blocks(fSpool ? static_cast<BlockSource&>(*fSpool) : *table, fVariables, tally);
        Interrupts interrupts;
        const auto outcome = [&]
        {
            const nb::gil_scoped_release released;
            return function(blocks, interrupts);
        }();
        interrupts.Rethrow();
        return ToTuple(outcome, blocks, isRightClosed);
    }

    nb::object fTable;
    std::vector<Variable> fVariables;
    std::vector<std::optional<Array>> fArrays; ///< keep alive what the variables borrow
    std::optional<WeightTally> fWeights;
    std::unique_ptr<Spool> fSpool;
    std::optional<TableBlocks> fReading; ///< where Read has got to
};

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
    module.attr("MISSING") = MCMV::gMissingValue;
    // Raises a RuntimeError, with words for the user, where TMPDIR is set and can't be used.
    module.def("temp_directory", [](const std::string& named) { return ChooseTempDirectory(named, "temp_dir="); });

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
        .def("add_variable", &Feed::AddVariable, "name"_a, "use"_a, nb::kw_only(), "column"_a = -1,
             "array"_a.none() = nb::none(), "num_codes"_a = 0, "rounding"_a = "none")
        .def("declare_missing", &Feed::DeclareMissing, "index"_a, "values"_a, "interval"_a.none(), "texts"_a)
        .def("set_categories", &Feed::SetCategories, "index"_a, "categories"_a, "unseen"_a = "changed")
        .def("categories", &Feed::GetCategories, "index"_a)
        .def("weights", &Feed::GetWeights)
        .def("set_weights", &Feed::SetWeights, "weights"_a)
        .def("learn", &Feed::Learn)
        .def("read", &Feed::Read, "max_rows"_a)
        .def("spool", &Feed::SpoolRecords, "directory"_a)
        .def("bin_supervised", &Feed::BinSupervised, "attributes"_a, "targets"_a, nb::kw_only(), "n_bins"_a,
             "max_distinct"_a, "small_bin_ratio"_a, "right_closed"_a, "temp_dir"_a, "progress"_a.none())
        .def("bin_equal_frequency", &Feed::BinEqualFrequency, "attributes"_a, nb::kw_only(), "n_bins"_a,
             "right_closed"_a, "temp_dir"_a, "progress"_a.none());
}
