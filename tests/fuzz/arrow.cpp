// What the Python package reads from Arrow batches and from arrays beside them, against values that were written down
// when the batches were made.

#include "tests/fuzz/arrowcolumn.h"
#include "tests/fuzz/check.h"

#include "hosts/python/src/batches.h"
#include "hosts/python/src/faults.h"
#include "hosts/python/src/tableblocks.h"

#include <mcobnqrt/mccommon.h>

#include <fuzzer/FuzzedDataProvider.h>

#include <algorithm>
#include <cmath>
#include <cstddef>
#include <cstdint>
#include <cstring>
#include <memory>
#include <numeric>
#include <optional>
#include <string>
#include <utility>
#include <vector>

using Input = FuzzedDataProvider;
using MCMV::gMissingValue;

namespace
{

constexpr double kMissingCode = -1.0;

/// A column of the stream, for all of its batches.
struct Column
{
    ValueMaker maker;
    std::optional<ValueMaker> indices; ///< into a dictionary, whose values `maker` makes; none without a dictionary
    std::vector<PlainValue> values;    ///< of all batches made so far
    ArrowSchema schema{};
    ArrowSchema dictionary{};
};

std::unique_ptr<Column> TakeColumn(Input& input)
{
    static const char* const kFormats[] = {"n",         "b",
                                           "c",         "C",
                                           "s",         "S",
                                           "i",         "I",
                                           "l",         "L",
                                           "e",         "f",
                                           "g",         "u",
                                           "U",         "vu",
                                           "tdD",       "tdm",
                                           "tss:",      "tsm:UTC",
                                           "tsn:",      "tsu:Europe/Berlin",
                                           "d:9,2",     "d:38,37",
                                           "d:7,-2",    "d:9,3,32",
                                           "d:18,4,64", "d:38,0,128"};
    static const char* const kIndexFormats[] = {"c", "C", "s", "S", "i", "I", "l", "L"};
    auto column =
        std::make_unique<Column>(Column{ValueMaker(input.PickValueInArray(kFormats)), std::nullopt, {}, {}, {}});
    if (input.ConsumeIntegralInRange(0, 3) == 0)
        column->indices = ValueMaker(input.PickValueInArray(kIndexFormats));
    return column;
}

/// Batches of the sizes that were picked. Each is gone when the next one is asked for.
class Producer : public Batches
{
public:
    explicit Producer(Input& input) : fInput(input)
    {
        fColumns.resize(input.ConsumeIntegralInRange<std::size_t>(1, 4));
        for (auto& column : fColumns)
        {
            column = TakeColumn(input);
            DescribeColumn(*column);
        }
        fSchema.format = "+s";
        fSchema.n_children = static_cast<std::int64_t>(fSchemas.size());
        fSchema.children = fSchemas.data();
        fBatchSizes.resize(input.ConsumeIntegralInRange<std::size_t>(0, 4));
        for (std::size_t& size : fBatchSizes)
        {
            size = input.ConsumeIntegralInRange(0, 15) == 0 ? input.ConsumeIntegralInRange<std::size_t>(0, 2500)
                                                            : input.ConsumeIntegralInRange<std::size_t>(0, 20);
        }
    }

    const std::vector<std::unique_ptr<Column>>& GetColumns() const { return fColumns; }

    std::size_t CountRows() const { return std::accumulate(fBatchSizes.begin(), fBatchSizes.end(), std::size_t(0)); }

    const ArrowSchema& GetSchema() const override { return fSchema; }

    const ArrowArray* Next(std::int64_t row) override
    {
        Check(row == fNumRows, "the number of rows before the batch");
        fArrays.clear();
        fChildren.clear();
        if (fNextBatch == fBatchSizes.size())
            return nullptr;
        MakeBatch(fBatchSizes[fNextBatch++]);
        fNumRows += fBatch.length;
        return &fBatch;
    }

private:
    void DescribeColumn(Column& column)
    {
        column.dictionary.format = column.maker.GetFormat().c_str();
        column.schema.format = (column.indices ? *column.indices : column.maker).GetFormat().c_str();
        column.schema.dictionary = column.indices ? &column.dictionary : nullptr;
        column.schema.flags = column.indices && fInput.ConsumeBool() ? 1 : 0; // the dictionary is ordered, or not
        fSchemas.push_back(&column.schema);
    }

    void MakeBatch(std::size_t numRows)
    {
        const auto offset = fInput.ConsumeIntegralInRange<std::size_t>(0, 9);
        for (const auto& column : fColumns) MakeChild(*column, offset, numRows);
        fBatch = ArrowArray{};
        fBatch.length = static_cast<std::int64_t>(numRows);
        fBatch.offset = static_cast<std::int64_t>(offset);
        fBatch.n_buffers = 1;
        fBatch.buffers = &fNoBuffer;
        fBatch.n_children = static_cast<std::int64_t>(fChildren.size());
        fBatch.children = fChildren.data();
    }

    PlainArray& AddArray()
    {
        fArrays.push_back(std::make_unique<PlainArray>());
        return *fArrays.back();
    }

    /// The child is as long as the batch with what lies before its beginning.
    void MakeChild(Column& column, std::size_t batchOffset, std::size_t numRows)
    {
        PlainArray& child = AddArray();
        const auto offset = fInput.ConsumeIntegralInRange<std::size_t>(0, 9);
        if (!column.indices)
            child.Make(fInput, column.maker, offset, batchOffset + numRows);
        else
        {
            PlainArray& dictionary = AddArray();
            const auto size = fInput.ConsumeIntegralInRange<std::size_t>(1, 20);
            dictionary.Make(fInput, column.maker, fInput.ConsumeIntegralInRange<std::size_t>(0, 3), size);
            child.MakeIndices(fInput, *column.indices, offset, batchOffset + numRows, size);
            child.array.dictionary = &dictionary.array;
            for (PlainValue& value : child.values)
            {
                if (!value.isMissing && !value.isBad)
                    value = dictionary.values[static_cast<std::size_t>(value.number)];
            }
        }
        fChildren.push_back(&child.array);
        column.values.insert(column.values.end(), child.values.begin() + static_cast<std::ptrdiff_t>(batchOffset),
                             child.values.end());
    }

    Input& fInput;
    std::vector<std::unique_ptr<Column>> fColumns;
    std::vector<ArrowSchema*> fSchemas;
    ArrowSchema fSchema{};
    std::vector<std::size_t> fBatchSizes;
    std::size_t fNextBatch = 0;
    std::int64_t fNumRows = 0; ///< of the batches made so far
    std::vector<std::unique_ptr<PlainArray>> fArrays;
    std::vector<ArrowArray*> fChildren;
    const void* fNoBuffer = nullptr;
    ArrowArray fBatch{};
};

/// An array beside the batches: doubles at some distance, which may be negative.
struct Beside
{
    std::vector<std::uint8_t> memory;
    std::vector<PlainValue> values;
};

StridedArray TakeArray(Input& input, Beside& beside, std::size_t length)
{
    const ValueMaker maker("g");
    const auto distance = static_cast<std::ptrdiff_t>(sizeof(double)) + input.ConsumeIntegralInRange(0, 9);
    const bool isBackwards = input.ConsumeBool();
    std::vector<StoredValue> pool(5);
    for (StoredValue& value : pool) value = maker.Make(input);
    beside.memory.resize(static_cast<std::size_t>(distance) * length + 1);
    for (std::size_t row = 0; row < length; ++row)
    {
        const StoredValue& value = pool[row * 7 % 11 % pool.size()];
        const std::size_t slot = isBackwards ? length - 1 - row : row;
        std::memcpy(beside.memory.data() + slot * static_cast<std::size_t>(distance), value.bytes.data(),
                    sizeof(double));
        beside.values.push_back(value.plain);
    }
    const std::size_t first = isBackwards && length > 0 ? (length - 1) * static_cast<std::size_t>(distance) : 0;
    return {beside.memory.data() + first, isBackwards ? -distance : distance, length, ColumnType::Storage::kDouble};
}

/// What a field's values should be, told one after the other.
class Expectation
{
public:
    Expectation(const Field& field, const std::vector<PlainValue>& values, bool isText)
        : fField(field), fValues(values), fIsText(isText)
    {
    }

    /// Nothing where the value can't be used. To be asked for each row once, in their order.
    std::optional<double> Tell(std::size_t row)
    {
        Check(row < fValues.size(), "a row that the stream has not given yet");
        const PlainValue& value = fValues[row];
        if (IsBad(row))
            return std::nullopt;
        if (fField.use == Field::Use::kCategory)
            return TellCode(value);
        if (fField.use == Field::Use::kWeight && !value.isMissing)
            return TellWeight(value.number);
        return value.isMissing ? gMissingValue : value.number;
    }

    /// Whether the row holds an index that is not in its dictionary. The reader refuses such a column without naming the
    /// row.
    bool IsBad(std::size_t row) const { return row < fValues.size() && fValues[row].isBad && !fValues[row].isMissing; }

    bool IsExact(std::size_t row) const
    {
        return fField.use == Field::Use::kCategory || fValues[row].isMissing || fValues[row].isExact;
    }

private:
    std::optional<double> TellWeight(double number) const
    {
        if (fField.missingNumbers.Contains(number))
            return gMissingValue;
        return number >= 0.0 && std::isfinite(number) ? std::optional(number) : std::nullopt;
    }

    std::optional<double> TellCode(const PlainValue& value)
    {
        const bool isMissing =
            value.isMissing || (fIsText ? fField.missingTexts.Contains(value.text)
                                        : std::isnan(value.number) || fField.missingNumbers.Contains(value.number));
        if (isMissing)
            return kMissingCode;
        const auto isSame = [&](const PlainValue& other)
        { return fIsText ? value.text == other.text : value.number == other.number; };
        const auto found = std::find_if(fCategories.begin(), fCategories.end(), isSame);
        const auto code = static_cast<std::size_t>(found - fCategories.begin());
        if (found == fCategories.end())
            fCategories.push_back(value);
        return code < 256 ? std::optional(static_cast<double>(code)) : std::nullopt;
    }

    const Field& fField;
    const std::vector<PlainValue>& fValues;
    bool fIsText;
    std::vector<PlainValue> fCategories; ///< in the order of arrival
};

Field::Use TakeUse(Input& input, bool isText, bool isScaled)
{
    if (isText)
        return Field::Use::kCategory;
    const auto use = static_cast<Field::Use>(input.ConsumeIntegralInRange(0, 3));
    // Scaled numbers that differ in the last bit alone may be one category or two.
    return isScaled && use == Field::Use::kCategory ? Field::Use::kAttribute : use;
}

void DeclareMissing(Input& input, Field& field)
{
    for (int i = input.ConsumeIntegralInRange(0, 2); i > 0; --i)
    {
        field.missingNumbers.AddValue(input.ConsumeIntegralInRange(-5, 5), "");
        field.missingTexts.AddValue(input.ConsumeBool() ? "a" : "more than twelve bytes", "");
    }
}

bool IsAsTold(double expected, double actual, bool isExact)
{
    if (std::isnan(expected))
        return std::isnan(actual);
    return isExact ? expected == actual : std::fabs(expected - actual) <= 1e-15 * std::fabs(expected);
}

/// One analysis, its fields and what is expected of each.
class Reading
{
public:
    explicit Reading(Input& input) : fProducer(input)
    {
        const std::size_t numArrays = input.ConsumeIntegralInRange<std::size_t>(0, 2);
        const auto& columns = fProducer.GetColumns();
        fFields.resize(columns.size() + numArrays);
        fBeside.resize(numArrays);
        for (std::size_t i = 0; i < columns.size(); ++i) AddColumn(input, i);
        const int oneMore = input.ConsumeIntegralInRange(0, 15) == 0 ? 1 : 0;
        for (std::size_t i = 0; i < numArrays; ++i)
            AddArray(input, i, fProducer.CountRows() + static_cast<std::size_t>(oneMore));
        fIsOfOneLength = numArrays == 0 || oneMore == 0;
    }

    void Run()
    {
        Block block(fFields.size());
        try
        {
            TableBlocks blocks(&fProducer, fFields);
            while (blocks.Next(block)) Compare(block);
            Check(fNumRows == fProducer.CountRows() && fIsOfOneLength, "rows are lacking");
        }
        catch (const DataFault& fault)
        {
            CheckFault(fault);
        }
    }

private:
    void AddColumn(Input& input, std::size_t index)
    {
        const Column& column = *fProducer.GetColumns()[index];
        Field& field = fFields[index];
        field.name = std::to_string(index);
        field.column = static_cast<int>(index);
        field.use = TakeUse(input, column.maker.IsText(), column.maker.IsScaled());
        DeclareMissing(input, field);
        fExpectations.emplace_back(field, column.values, column.maker.IsText());
    }

    void AddArray(Input& input, std::size_t index, std::size_t length)
    {
        const std::size_t fieldIndex = fProducer.GetColumns().size() + index;
        Field& field = fFields[fieldIndex];
        field.name = std::to_string(fieldIndex);
        field.use = TakeUse(input, false, false);
        field.array = TakeArray(input, fBeside[index], length);
        DeclareMissing(input, field);
        fExpectations.emplace_back(field, fBeside[index].values, false);
    }

    void Compare(Block& block)
    {
        Check(block.numRows > 0 && block.numRows <= Block::kMaxRows, "number of rows of a block");
        for (std::size_t field = 0; field < fFields.size(); ++field)
        {
            for (std::size_t i = 0; i < block.numRows; ++i)
            {
                const std::size_t row = fNumRows + i;
                const std::optional<double> expected = fExpectations[field].Tell(row);
                Check(expected.has_value(), "a value that can't be used was read");
                const double actual = block.At(field, i);
                if (!IsAsTold(*expected, actual, fExpectations[field].IsExact(row)))
                {
                    Fail("row " + std::to_string(row) + " of " + std::to_string(field) + ": " +
                         std::to_string(*expected) + " was written, " + std::to_string(actual) + " read");
                }
            }
        }
        fNumRows += block.numRows;
    }

    /// The row that the fault names is the first one of its field that can't be used.
    void CheckFault(const DataFault& fault)
    {
        if (!fault.GetColumn())
        {
            Check(!fIsOfOneLength || HasBadPlace(), "a fault without a column");
            return;
        }
        const auto field = static_cast<std::size_t>(std::stoul(*fault.GetColumn()));
        if (fault.GetRow() < 0)
        {
            Check(fProducer.GetColumns().at(field)->schema.flags != 0, "the column has no order to be told twice");
            return;
        }
        const auto bad = static_cast<std::size_t>(fault.GetRow());
        Check(bad >= fNumRows && bad < fNumRows + Block::kMaxRows, "a fault in another block");
        for (std::size_t row = fNumRows; row <= bad; ++row)
            Check(fExpectations[field].Tell(row).has_value() == (row != bad), "a fault in another row");
    }

    /// In the block that was to be read.
    bool HasBadPlace() const
    {
        for (const Expectation& expectation : fExpectations)
        {
            for (std::size_t row = fNumRows; row < fNumRows + Block::kMaxRows; ++row)
            {
                if (expectation.IsBad(row))
                    return true;
            }
        }
        return false;
    }

    Producer fProducer;
    std::vector<Field> fFields;
    std::vector<Beside> fBeside;
    std::vector<Expectation> fExpectations; ///< by field
    bool fIsOfOneLength = true;
    std::size_t fNumRows = 0; ///< read so far
};

} // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* bytes, std::size_t size)
{
    Input input(bytes, size);
    Reading(input).Run();
    return 0;
}
