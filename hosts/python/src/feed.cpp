#include "hosts/python/src/feed.h"

#include "bins/categorytally.h"
#include "bins/jsonnames.h"
#include "hosts/python/src/calls.h"
#include "hosts/python/src/columntype.h"
#include "hosts/python/src/faults.h"
#include "hosts/python/src/libraryblocks.h"

#include <mcobnqrt/mccommon.h>

#include <nanobind/stl/string.h>

#include <algorithm>
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

WeightTally Tally(BlockSource& source, std::vector<Field>& fields)
{
    PolledBlocks polled(source);
    TalliedBlocks blocks(polled, fields);
    Block block(fields.size());
    while (blocks.Next(block)) continue;
    return blocks.GetTally();
}

} // namespace

std::size_t Feed::AddField(const std::string& name, const std::string& use, int column,
                           const std::optional<Array>& array, const std::string& rounding, bool isScaled,
                           bool isOptional)
{
    Field field;
    field.isOptional = isOptional;
    field.isScaledToRecords = isScaled;
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

std::string Feed::DescribeUnusable(std::size_t index) const
{
    const Field& field = fFields.at(index);
    std::vector<std::string> categories = field.texts.GetKeys(field.isComplete);
    if (field.hasTooMany)
        categories.resize(kMostCategories + 1);
    return ::DescribeUnusable(categories, field.numCoded);
}

void Feed::Drop(std::size_t index)
{
    if (fSpool)
        fSpool->Drop(index);
    fFields.erase(fFields.begin() + static_cast<std::ptrdiff_t>(index));
    fArrays.erase(fArrays.begin() + static_cast<std::ptrdiff_t>(index));
}

std::vector<CategoryCodes> Feed::CountCategories(const std::vector<std::pair<int, std::optional<int>>>& pairs,
                                                 double rareShare, bool isByRate)
{
    std::optional<TableBlocks> table;
    LibraryBlocks blocks(OpenBlocks(table), fFields, GetTally());
    Interrupts interrupts;
    const std::vector<std::shared_ptr<const Variable>> variables = MakeVariables(fFields, std::nullopt);
    std::vector<CategoryTally::Pair> counted;
    counted.reserve(pairs.size());
    for (const auto& [attribute, target] : pairs) counted.push_back({attribute, target});
    CategoryTally tally(variables, counted);
    {
        const nb::gil_scoped_release released;
        BlockRecords records(blocks, fFields.size(), interrupts);
        while (records.HasNext()) tally.Add(*records.Next());
    }
    interrupts.Rethrow();
    std::vector<CategoryCodes> codes;
    for (const CategoryTally::Pair& pair : counted)
    {
        const Variable& attribute = *variables[static_cast<std::size_t>(pair.attribute)];
        codes.push_back(MakeCategoryCodes(attribute.categories, *tally.Find(pair), true, rareShare, isByRate));
    }
    return codes;
}

void Feed::SetCodes(std::size_t index, const CategoryCodes& codes, double rareShare, const std::string& order,
                    const std::string& target)
{
    Field& field = fFields.at(index);
    field.recoding.names = codes.names;
    for (const std::string& text : field.texts.GetKeys(field.isComplete))
    {
        const auto found = std::find(codes.names.begin(), codes.names.end(), text);
        const auto own = static_cast<std::size_t>(found - codes.names.begin());
        field.recoding.codes.push_back(static_cast<double>(found == codes.names.end() ? codes.rareCode.value() : own));
    }
    for (const auto& [name, value] : kCategoryOrderNames)
        field.categoryOrder = order == name ? value : field.categoryOrder;
    field.orderTarget = target;
    if (codes.rareCode)
        field.rare = RareCategories{*codes.rareCode, rareShare, codes.rare};
}

std::pair<std::int64_t, double> Feed::GetWeights() const
{
    return {fWeights.value().numPositive, fWeights.value().largest};
}

void Feed::SetWeights(const std::pair<std::int64_t, double>& weights, double scale)
{
    fWeights = WeightTally{WeightRounding::kNone, weights.first, weights.second, scale};
}

double Feed::ScaleWeights()
{
    const std::size_t index = FindWeight(fFields).value();
    std::optional<TableBlocks> table;
    LibraryBlocks blocks(OpenBlocks(table), fFields, GetTally());
    double total = 0.0;
    {
        const nb::gil_scoped_release released;
        PolledBlocks polled(blocks);
        Block block(fFields.size());
        while (polled.Next(block))
        {
            for (std::size_t row = 0; row < block.numRows; ++row)
            {
                const double weight = block.At(index, row);
                total += weight == MCMV::gMissingValue ? 0.0 : weight;
            }
        }
    }
    fWeights->ScaleToRecords(total);
    return fWeights->scale;
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
    LibraryBlocks blocks(OpenBlocks(table), fFields, GetTally());
    Interrupts interrupts;
    Bins bins = Describe(settings, request.target, dataName);
    {
        const nb::gil_scoped_release released;
        BinFields(bins, fFields, blocks, request, progress, interrupts);
    }
    interrupts.Rethrow();
    return bins;
}

Evaluation Feed::Count(Bins first, const std::vector<Counted>& counted, const std::optional<std::string>& dataName,
                       bool areGroups)
{
    std::optional<TableBlocks> table;
    WeightTally tally = fWeights.value_or(WeightTally());
    if (const std::optional<std::size_t> index = FindWeight(fFields))
        tally.rounding = fFields[*index].rounding;
    BlockSource& records = OpenBlocks(table);
    Evaluation evaluation;
    {
        const nb::gil_scoped_release released;
        PolledBlocks blocks(records);
        evaluation = CountRecords(std::move(first), counted, blocks, fFields, WeightGrid(tally), areGroups);
    }
    evaluation.second.dataName = dataName;
    return evaluation;
}

BlockSource& Feed::OpenBlocks(std::optional<TableBlocks>& table)
{
    if (!fSpool)
        return table.emplace(GetBatches(), fFields);
    fSpool->Rewind();
    return *fSpool;
}

Batches* Feed::GetBatches() const
{
    return fTable.is_none() ? nullptr : nb::cast<Table&>(fTable).batches.get();
}

/// Of all weights.
WeightTally Feed::GetTally()
{
    TallyArray();
    WeightTally tally = fWeights.value_or(WeightTally());
    if (const std::optional<std::size_t> index = FindWeight(fFields))
        tally.rounding = fFields[*index].rounding;
    return tally;
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
