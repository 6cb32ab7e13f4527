#include "hosts/python/src/tableblocks.h"

#include "bins/categoryorder.h"
#include "bins/numbers.h"
#include "hosts/python/src/faults.h"

#include <mcobnqrt/mccommon.h>

#include <algorithm>
#include <array>
#include <charconv>
#include <cmath>
#include <optional>
#include <string>
#include <string_view>
#include <utility>

namespace
{

using MCMV::gMissingValue;

constexpr double kMissingCode = -1.0;

std::string Describe(std::string_view text)
{
    return "the category '" + std::string(text) + "'";
}

std::string Describe(double number)
{
    std::array<char, 32> text;
    const std::to_chars_result end = std::to_chars(text.data(), text.data() + text.size(), number);
    return "the category " + std::string(text.data(), end.ptr);
}

std::string GetName(std::string_view text)
{
    return std::string(text);
}

std::string GetName(double number)
{
    return FormatNumber(number);
}

/// The code behind all others. Notes the name, unless there are enough of them.
double KeepUnseen(Field& field, const std::string& name)
{
    constexpr std::size_t kEnough = 10;
    std::vector<std::string>& names = field.unseenNames;
    if (names.size() < kEnough && std::find(names.begin(), names.end(), name) == names.end())
        names.push_back(name);
    return static_cast<double>(field.GetNumCategories());
}

double EncodeUnseen(const Field& field, const std::string& category, std::int64_t row)
{
    switch (field.unseen)
    {
    case Field::Unseen::kKept: // has been told apart
        break;
    case Field::Unseen::kMissing:
        return kMissingCode;
    case Field::Unseen::kError:
        throw DataFault(category + " is not among those that the bins were made of; unseen=\"missing\" gives it no bin",
                        field.name, row);
    case Field::Unseen::kChanged:
        break;
    }
    throw DataFault(category + " was not there when the data were read for the first time", field.name, row);
}

/// The code of a category, which becomes one of `table` where that may still grow.
template<class Table, class View>
double EncodeCategory(Field& field, Table& table, const View& category, std::int64_t row)
{
    if (const std::optional<std::size_t> code = table.Find(category))
        return static_cast<double>(*code);
    if (field.unseenCode)
        return static_cast<double>(*field.unseenCode);
    if (field.isComplete && field.unseen == Field::Unseen::kKept)
        return KeepUnseen(field, GetName(category));
    if (field.isComplete)
        return EncodeUnseen(field, Describe(category), row);
    if (table.GetSize() >= kMostCategories)
    {
        if (!field.isOptional)
            throw DataFault("there are more than 256 categories", field.name, row);
        field.hasTooMany = true;
        return kMissingCode;
    }
    return static_cast<double>(table.Encode(category));
}

class ValueField : public FieldReader
{
public:
    explicit ValueField(std::unique_ptr<ColumnReader> reader) : fReader(std::move(reader)) {}

    void Read(std::size_t first, std::size_t count, std::int64_t, double* values) override
    {
        fReader->Read(first, count, values);
    }

private:
    std::unique_ptr<ColumnReader> fReader;
};

/// A weight that is declared missing is gMissingValue from here on. The library leaves out one of a negative weight or NaN
/// as well and without a word, which nobody wants to find out later.
class WeightField : public FieldReader
{
public:
    WeightField(std::unique_ptr<ColumnReader> reader, const Field& field)
        : fReader(std::move(reader)), fField(field), fHasMissing(field.HasMissingNumbers())
    {
    }

    void Read(std::size_t first, std::size_t count, std::int64_t row, double* values) override
    {
        fReader->Read(first, count, values);
        for (std::size_t i = 0; i < count; ++i)
        {
            if (fHasMissing && fField.missingNumbers.Contains(values[i]))
                values[i] = gMissingValue;
            if (!(values[i] >= 0.0 && values[i] < HUGE_VAL) && values[i] != gMissingValue)
                throw DataFault(Describe(values[i]), fField.name, row + static_cast<std::int64_t>(i));
        }
    }

private:
    static std::string Describe(double weight)
    {
        if (std::isnan(weight))
            return "the weight is NaN";
        return weight < 0.0 ? "the weight is negative" : "the weight is infinite";
    }

    std::unique_ptr<ColumnReader> fReader;
    const Field& fField;
    bool fHasMissing;
};

class NumberCategoryField : public FieldReader
{
public:
    NumberCategoryField(std::unique_ptr<ColumnReader> reader, Field& field) : fReader(std::move(reader)), fField(field)
    {
    }

    void Read(std::size_t first, std::size_t count, std::int64_t row, double* values) override
    {
        fReader->Read(first, count, values);
        for (std::size_t i = 0; i < count; ++i) values[i] = Encode(values[i], row + static_cast<std::int64_t>(i));
    }

private:
    double Encode(double value, std::int64_t row)
    {
        if (value == gMissingValue || std::isnan(value) || fField.missingNumbers.Contains(value))
            return kMissingCode;
        return EncodeCategory(fField, fField.numbers, value, row);
    }

    std::unique_ptr<ColumnReader> fReader;
    Field& fField;
};

double EncodeText(Field& field, std::optional<std::string_view> text, std::int64_t row)
{
    if (!text)
        return kMissingCode;
    if (field.missingTexts.GetNDiscreteValues() > 0 && field.missingTexts.Contains(std::string(*text)))
        return kMissingCode;
    return EncodeCategory(field, field.texts, *text, row);
}

class TextCategoryField : public FieldReader
{
public:
    TextCategoryField(TextReader reader, Field& field) : fReader(reader), fField(field) {}

    void Read(std::size_t first, std::size_t count, std::int64_t row, double* values) override
    {
        for (std::size_t i = 0; i < count; ++i)
            values[i] = EncodeText(fField, fReader.At(first + i), row + static_cast<std::int64_t>(i));
    }

private:
    TextReader fReader;
    Field& fField;
};

/// A text of a dictionary is looked up once for each batch. What stands in the dictionary alone is no category.
class DictionaryCategoryField : public FieldReader
{
public:
    DictionaryCategoryField(std::unique_ptr<ColumnReader> indices, TextReader texts, std::size_t size, Field& field)
        : fIndices(std::move(indices)), fTexts(texts), fCodes(size, gMissingValue), fField(field)
    {
    }

    void Read(std::size_t first, std::size_t count, std::int64_t row, double* values) override
    {
        fIndices->Read(first, count, values);
        for (std::size_t i = 0; i < count; ++i)
        {
            values[i] = values[i] == gMissingValue
                            ? kMissingCode
                            : Encode(CheckIndex(values[i], fCodes.size()), row + static_cast<std::int64_t>(i));
        }
    }

private:
    double Encode(std::size_t index, std::int64_t row)
    {
        double& code = fCodes[index];
        if (code == gMissingValue)
            code = EncodeText(fField, fTexts.At(index), row);
        return code;
    }

    std::unique_ptr<ColumnReader> fIndices;
    TextReader fTexts;
    std::vector<double> fCodes; ///< by index; gMissingValue where not looked up yet
    Field& fField;
};

std::vector<std::string> ReadTexts(const ArrowArray& dictionary, const ColumnType& type)
{
    const TextReader reader(dictionary, type.storage, 0);
    std::vector<std::string> texts;
    for (std::size_t i = 0; i < static_cast<std::size_t>(dictionary.length); ++i)
    {
        if (const std::optional<std::string_view> text = reader.At(i))
            texts.emplace_back(*text);
    }
    return texts;
}

std::vector<double> ReadNumbers(const ArrowArray& dictionary, ColumnType type)
{
    type.isDictionary = false;
    std::vector<double> numbers(static_cast<std::size_t>(dictionary.length));
    MakeReader(dictionary, type, 0)->Read(0, numbers.size(), numbers.data());
    numbers.erase(std::remove_if(numbers.begin(), numbers.end(), [](double number) { return std::isnan(number); }),
                  numbers.end());
    return numbers;
}

/// Tells the field the order of the categories that an ordered dictionary declares. Once all categories are known
/// they have their codes, and the order says no more.
void DeclareOrder(Field& field, const ColumnType& type, const ArrowArray& column)
{
    if (!type.isDictionary || !type.isOrdered || field.use != Field::Use::kCategory || field.isComplete)
        return;
    const bool isMerged = type.IsText() ? field.texts.GetDeclaredOrder().Merge(ReadTexts(*column.dictionary, type))
                                        : field.numbers.GetDeclaredOrder().Merge(ReadNumbers(*column.dictionary, type));
    if (!isMerged)
        throw DataFault("two batches declare the categories in different orders", field.name);
}

/// The type of the field's column, if it is one for the field's use.
ColumnType CheckType(const ArrowSchema& schema, const Field& field)
{
    if (field.column >= schema.n_children)
        throw DataFault("there is no such column", field.name);
    ColumnType type = ReadColumnType(*schema.children[field.column]);
    if (type.storage == ColumnType::Storage::kNone)
        throw DataFault("a column of this type can't be used: " + type.kind, field.name);
    if (type.IsText() && field.use != Field::Use::kCategory)
        throw DataFault("the column holds texts, not numbers", field.name);
    return type;
}

} // namespace

TableBlocks::TableBlocks(Batches* batches, std::vector<Field>& fields)
    : fBatches(batches), fFields(fields), fTypes(fields.size())
{
    for (std::size_t i = 0; i < fields.size(); ++i)
    {
        if (fields[i].column >= 0)
        {
            if (batches == nullptr)
                throw DataFault("there is no table with the column", fields[i].name);
            fTypes[i] = CheckType(batches->GetSchema(), fields[i]);
            continue;
        }
        const auto length = static_cast<std::int64_t>(fields[i].array.length);
        if (fNumArrayRows >= 0 && length != fNumArrayRows)
        {
            throw DataFault("there are " + std::to_string(length) + " values for " + std::to_string(fNumArrayRows) +
                                " rows",
                            fields[i].name);
        }
        fNumArrayRows = length;
    }
}

bool TableBlocks::Next(Block& block)
{
    block.numRows = 0;
    if (fNextRow == fNumRows && !NextBatch())
        return false;
    const auto first = static_cast<std::size_t>(fNextRow);
    block.numRows = std::min(static_cast<std::size_t>(fNumRows - fNextRow), Block::kMaxRows);
    for (std::size_t i = 0; i < fReaders.size(); ++i)
        fReaders[i]->Read(first, block.numRows, fFirstRow + fNextRow, block.GetField(i));
    fNextRow += static_cast<std::int64_t>(block.numRows);
    return true;
}

/// Goes on to the next batch that has rows. The arrays alone make one batch.
bool TableBlocks::NextBatch()
{
    while (!fIsAtEnd)
    {
        fFirstRow += fNumRows;
        fNextRow = fNumRows = 0;
        const ArrowArray* const batch = fBatches != nullptr ? fBatches->Next(fFirstRow) : nullptr;
        if (batch != nullptr)
            fNumRows = batch->length;
        else
        {
            fIsAtEnd = true;
            if (fBatches == nullptr)
                fNumRows = fNumArrayRows;
        }
        const std::int64_t numSeen = fFirstRow + fNumRows;
        if (fNumArrayRows >= 0 && (numSeen > fNumArrayRows || (fIsAtEnd && numSeen < fNumArrayRows)))
        {
            throw DataFault("the table has " + std::string(fIsAtEnd ? "" : "at least ") + std::to_string(numSeen) +
                            " rows, but there are " + std::to_string(fNumArrayRows) + " values beside it");
        }
        if (fNumRows > 0)
        {
            OpenBatch(batch);
            return true;
        }
    }
    return false;
}

void TableBlocks::OpenBatch(const ArrowArray* batch)
{
    fReaders.clear();
    for (std::size_t i = 0; i < fFields.size(); ++i) fReaders.push_back(MakeFieldReader(i, batch));
}

std::unique_ptr<FieldReader> TableBlocks::MakeFieldReader(std::size_t index, const ArrowArray* batch)
{
    Field& field = fFields[index];
    const ColumnType& type = fTypes[index];
    std::unique_ptr<ColumnReader> reader;
    if (batch == nullptr || field.column < 0) // without batches all fields have arrays
    {
        StridedArray rest = field.array;
        rest.data = static_cast<const char*>(rest.data) + static_cast<std::ptrdiff_t>(fFirstRow) * rest.stride;
        reader = MakeReader(rest);
    }
    else
    {
        const ArrowArray& column = *batch->children[field.column];
        DeclareOrder(field, type, column);
        if (type.IsText() && type.isDictionary)
        {
            return std::make_unique<DictionaryCategoryField>(
                MakeIndexReader(column, type, batch->offset), TextReader(*column.dictionary, type.storage, 0),
                static_cast<std::size_t>(column.dictionary->length), field);
        }
        if (type.IsText())
            return std::make_unique<TextCategoryField>(TextReader(column, type.storage, batch->offset), field);
        reader = MakeReader(column, type, batch->offset);
    }
    switch (field.use)
    {
    case Field::Use::kCategory:
        return std::make_unique<NumberCategoryField>(std::move(reader), field);
    case Field::Use::kWeight:
        return std::make_unique<WeightField>(std::move(reader), field);
    case Field::Use::kAttribute:
    case Field::Use::kCode:
        break;
    }
    return std::make_unique<ValueField>(std::move(reader));
}
