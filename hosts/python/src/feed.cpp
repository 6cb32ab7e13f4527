#include "hosts/python/src/feed.h"

#include "bins/jsonnames.h"
#include "hosts/python/src/columntype.h"
#include "hosts/python/src/faults.h"
#include "hosts/python/src/libraryblocks.h"

#include <mcobnqrt/mccommon.h>

#include <nanobind/stl/string.h>

#include <limits>

namespace nb = nanobind;

namespace
{

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

Field::Use UseOf(const std::string& use)
{
    if (use == "attribute")
        return Field::Use::kAttribute;
    if (use == "category")
        return Field::Use::kCategory;
    if (use == "code")
        return Field::Use::kCode;
    if (use == "weight")
        return Field::Use::kWeight;
    throw nb::value_error("no such use");
}

Field::Unseen UnseenOf(const std::string& unseen)
{
    if (unseen == "changed")
        return Field::Unseen::kChanged;
    if (unseen == "error")
        return Field::Unseen::kError;
    if (unseen == "missing")
        return Field::Unseen::kMissing;
    if (unseen == "kept")
        return Field::Unseen::kKept;
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

/// Appends values of the field to `values`.
void AppendWithNaN(const Field& field, const double* source, std::size_t count, std::vector<double>& values)
{
    const bool isCode = field.use != Field::Use::kAttribute;
    const bool hasUserMissing = field.HasMissingNumbers();
    for (std::size_t i = 0; i < count; ++i)
    {
        const bool isMissing =
            isCode ? source[i] < 0.0
                   : source[i] == MCMV::gMissingValue || (hasUserMissing && field.missingNumbers.Contains(source[i]));
        values.push_back(isMissing ? std::numeric_limits<double>::quiet_NaN() : source[i]);
    }
}

/// Kinds of columns that are not named here hold plain numbers or texts.
ValueKind ValueKindOf(const std::string& kind)
{
    for (const auto& [name, valueKind] : kValueKindNames)
    {
        if (kind == name)
            return valueKind;
    }
    return ValueKind::kNumber;
}

WeightTally Tally(BlockSource& source, const std::vector<Field>& fields)
{
    PolledBlocks polled(source);
    TalliedBlocks blocks(polled, fields);
    Block block(fields.size());
    while (blocks.Next(block)) continue;
    return blocks.GetTally();
}

} // namespace

std::size_t Feed::AddField(const std::string& name, const std::string& use, int column,
                           const std::optional<Array>& array, const std::string& rounding)
{
    Field field;
    field.name = name;
    field.use = UseOf(use);
    field.column = array ? -1 : column;
    field.rounding = FindWeightRounding(rounding).value();
    if (array)
        field.array = Borrow(*array, name);
    else if (const Batches* const batches = GetBatches(); batches && column < batches->GetSchema().n_children)
    {
        const ColumnType type = ReadColumnType(*batches->GetSchema().children[column]);
        field.valueKind = ValueKindOf(type.kind);
        field.timeZone = type.timeZone;
    }
    fFields.push_back(std::move(field));
    fArrays.push_back(array);
    return fFields.size() - 1;
}

void Feed::DeclareMissing(std::size_t index, const std::vector<double>& values,
                          std::optional<std::pair<double, double>> interval, const std::vector<std::string>& texts)
{
    Field& field = fFields.at(index);
    for (const double value : values) field.missingNumbers.AddValue(TellFromMissing(value), "");
    field.missingInterval = interval;
    if (interval)
        field.missingNumbers.SetInterval(BINNumericInterval(interval->first, interval->second));
    for (const std::string& text : texts) field.missingTexts.AddValue(text, "");
}

void Feed::SetCategories(std::size_t index, const nb::list& categories, const std::string& unseen)
{
    Field& field = fFields.at(index);
    for (nb::handle category : categories)
    {
        if (nb::isinstance<nb::str>(category))
            field.texts.Encode(nb::cast<std::string>(category));
        else
            field.numbers.Encode(nb::cast<double>(category));
    }
    field.isComplete = true;
    field.unseen = UnseenOf(unseen);
}

void Feed::SetValueKind(std::size_t index, const std::string& kind)
{
    fFields.at(index).valueKind = ValueKindOf(kind);
}

nb::list Feed::GetCategories(std::size_t index) const
{
    const Field& field = fFields.at(index);
    nb::list categories;
    const auto append = [&](const auto& table)
    {
        for (const auto& key : table.GetKeys(field.isComplete)) categories.append(key);
    };
    append(field.texts);
    append(field.numbers);
    return categories;
}

std::pair<std::int64_t, double> Feed::GetWeights() const
{
    return {fWeights.value().numPositive, fWeights.value().largest};
}

void Feed::SetWeights(const std::pair<std::int64_t, double>& weights)
{
    fWeights = WeightTally{WeightRounding::kNone, weights.first, weights.second};
}

void Feed::Learn()
{
    TableBlocks table(GetBatches(), fFields);
    const nb::gil_scoped_release released;
    fWeights = Tally(table, fFields);
}

void Feed::SpoolRecords(const std::string& directory)
{
    TableBlocks table(GetBatches(), fFields);
    const nb::gil_scoped_release released;
    PolledBlocks polled(table);
    TalliedBlocks blocks(polled, fFields);
    fSpool = std::make_unique<Spool>(blocks, fFields, directory);
    fWeights = blocks.GetTally();
}

nb::list Feed::Read(std::size_t maxRows)
{
    if (!fReading)
        fReading.emplace(GetBatches(), fFields);
    std::vector<std::vector<double>> values(fFields.size());
    {
        const nb::gil_scoped_release released;
        PolledBlocks blocks(*fReading);
        Block block(fFields.size());
        std::size_t numRows = 0;
        for (; numRows < maxRows && blocks.Next(block); numRows += block.numRows)
        {
            for (std::size_t i = 0; i < values.size(); ++i)
                AppendWithNaN(fFields[i], block.GetField(i), block.numRows, values[i]);
        }
    }
    nb::list arrays;
    for (std::vector<double>& ofField : values) arrays.append(ToArray(std::move(ofField)));
    return arrays;
}

Bins Feed::Describe(const Settings& settings, std::optional<int> target,
                    const std::optional<std::string>& dataName) const
{
    Bins bins;
    bins.settings = settings;
    bins.dataName = dataName;
    bins.variables = MakeVariables(fFields, target);
    return bins;
}

Bins Feed::Bin(const Settings& settings, const RunRequest& request, const std::optional<std::string>& dataName,
               const nb::object& progress)
{
    std::optional<TableBlocks> table;
    if (!fSpool)
        table.emplace(GetBatches(), fFields);
    TallyArray();
    WeightTally tally = fWeights.value_or(WeightTally());
    if (const std::optional<std::size_t> index = FindWeight(fFields))
        tally.rounding = fFields[*index].rounding;
    LibraryBlocks blocks(fSpool ? static_cast<BlockSource&>(*fSpool) : *table, fFields, tally);
    Interrupts interrupts;
    Bins bins = Describe(settings, request.target, dataName);
    {
        const nb::gil_scoped_release released;
        BinFields(bins, fFields, blocks, request, progress, interrupts);
    }
    interrupts.Rethrow();
    return bins;
}

Evaluation Feed::Count(Bins first, const std::vector<Counted>& counted, const std::optional<std::string>& dataName)
{
    std::optional<TableBlocks> table;
    if (!fSpool)
        table.emplace(GetBatches(), fFields);
    WeightTally tally = fWeights.value_or(WeightTally());
    if (const std::optional<std::size_t> index = FindWeight(fFields))
        tally.rounding = fFields[*index].rounding;
    Evaluation evaluation;
    {
        const nb::gil_scoped_release released;
        PolledBlocks blocks(fSpool ? static_cast<BlockSource&>(*fSpool) : *table);
        evaluation = CountRecords(std::move(first), counted, blocks, fFields, WeightGrid(tally));
    }
    evaluation.second.dataName = dataName;
    return evaluation;
}

Batches* Feed::GetBatches() const
{
    return fTable.is_none() ? nullptr : nb::cast<Table&>(fTable).batches.get();
}

/// An array of weights is at hand, and can be read at any time.
void Feed::TallyArray()
{
    const std::optional<std::size_t> index = FindWeight(fFields);
    if (!index || fWeights)
        return;
    std::vector<Field> weight(1);
    weight[0].name = fFields[*index].name;
    weight[0].use = Field::Use::kWeight;
    weight[0].array = fFields[*index].array;
    weight[0].rounding = fFields[*index].rounding;
    TableBlocks blocks(nullptr, weight);
    const nb::gil_scoped_release released;
    fWeights = Tally(blocks, weight);
}
