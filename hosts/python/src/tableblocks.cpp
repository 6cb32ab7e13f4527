#include "hosts/python/src/tableblocks.h"

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

/// A tuple of the library holds a code in 8 bits.
constexpr std::size_t kMaxCategories = 256;
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

double EncodeUnseen(const Variable& variable, const std::string& category, std::int64_t row)
{
    switch (variable.unseen)
    {
    case Variable::Unseen::kMissing:
        return kMissingCode;
    case Variable::Unseen::kError:
        throw DataFault(category + " is not among those that the bins were made of; unseen=\"missing\" gives it no bin",
                        variable.name, row);
    case Variable::Unseen::kChanged:
        break;
    }
    throw DataFault(category + " was not there when the data were read for the first time", variable.name, row);
}

/// The code of a category, which becomes one of `table` where that may still grow.
template<class Table, class View>
double EncodeCategory(Variable& variable, Table& table, const View& category, std::int64_t row)
{
    if (const std::optional<std::size_t> code = table.Find(category))
        return static_cast<double>(*code);
    if (variable.isComplete)
        return EncodeUnseen(variable, Describe(category), row);
    if (table.GetSize() >= kMaxCategories)
        throw DataFault("there are more than 256 categories", variable.name, row);
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
    WeightField(std::unique_ptr<ColumnReader> reader, const Variable& variable)
        : fReader(std::move(reader)), fVariable(variable), fHasMissing(variable.HasMissingNumbers())
    {
    }

    void Read(std::size_t first, std::size_t count, std::int64_t row, double* values) override
    {
        fReader->Read(first, count, values);
        for (std::size_t i = 0; i < count; ++i)
        {
            if (fHasMissing && fVariable.missingNumbers.Contains(values[i]))
                values[i] = gMissingValue;
            if (!(values[i] >= 0.0 && values[i] < HUGE_VAL) && values[i] != gMissingValue)
                throw DataFault(Describe(values[i]), fVariable.name, row + static_cast<std::int64_t>(i));
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
    const Variable& fVariable;
    bool fHasMissing;
};

class NumberCategoryField : public FieldReader
{
public:
    NumberCategoryField(std::unique_ptr<ColumnReader> reader, Variable& variable)
        : fReader(std::move(reader)), fVariable(variable)
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
        if (value == gMissingValue || std::isnan(value) || fVariable.missingNumbers.Contains(value))
            return kMissingCode;
        return EncodeCategory(fVariable, fVariable.numbers, value, row);
    }

    std::unique_ptr<ColumnReader> fReader;
    Variable& fVariable;
};

double EncodeText(Variable& variable, std::optional<std::string_view> text, std::int64_t row)
{
    if (!text)
        return kMissingCode;
    if (variable.missingTexts.GetNDiscreteValues() > 0 && variable.missingTexts.Contains(std::string(*text)))
        return kMissingCode;
    return EncodeCategory(variable, variable.texts, *text, row);
}

class TextCategoryField : public FieldReader
{
public:
    TextCategoryField(TextReader reader, Variable& variable) : fReader(reader), fVariable(variable) {}

    void Read(std::size_t first, std::size_t count, std::int64_t row, double* values) override
    {
        for (std::size_t i = 0; i < count; ++i)
            values[i] = EncodeText(fVariable, fReader.At(first + i), row + static_cast<std::int64_t>(i));
    }

private:
    TextReader fReader;
    Variable& fVariable;
};

/// A text of a dictionary is looked up once for each batch. What stands in the dictionary alone is no category.
class DictionaryCategoryField : public FieldReader
{
public:
    DictionaryCategoryField(std::unique_ptr<ColumnReader> places, TextReader texts, std::size_t size,
                            Variable& variable)
        : fPlaces(std::move(places)), fTexts(texts), fCodes(size, gMissingValue), fVariable(variable)
    {
    }

    void Read(std::size_t first, std::size_t count, std::int64_t row, double* values) override
    {
        fPlaces->Read(first, count, values);
        for (std::size_t i = 0; i < count; ++i)
        {
            values[i] = values[i] == gMissingValue
                            ? kMissingCode
                            : Encode(CheckPlace(values[i], fCodes.size()), row + static_cast<std::int64_t>(i));
        }
    }

private:
    double Encode(std::size_t place, std::int64_t row)
    {
        double& code = fCodes[place];
        if (code == gMissingValue)
            code = EncodeText(fVariable, fTexts.At(place), row);
        return code;
    }

    std::unique_ptr<ColumnReader> fPlaces;
    TextReader fTexts;
    std::vector<double> fCodes; ///< by place; gMissingValue where not looked up yet
    Variable& fVariable;
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

/// Tells the variable the order of the categories that an ordered dictionary declares. Once all categories are known
/// they have their codes, and the order says no more.
void DeclareOrder(Variable& variable, const ColumnType& type, const ArrowArray& column)
{
    if (!type.isDictionary || !type.isOrdered || variable.use != Variable::Use::kCategory || variable.isComplete)
        return;
    const bool isMerged = type.IsText()
                              ? variable.texts.GetDeclaredOrder().Merge(ReadTexts(*column.dictionary, type))
                              : variable.numbers.GetDeclaredOrder().Merge(ReadNumbers(*column.dictionary, type));
    if (!isMerged)
        throw DataFault("two batches declare the categories in different orders", variable.name);
}

/// The type of the variable's column, if it is one for the variable's use.
ColumnType CheckType(const ArrowSchema& schema, const Variable& variable)
{
    if (variable.column >= schema.n_children)
        throw DataFault("there is no such column", variable.name);
    ColumnType type = ReadColumnType(*schema.children[variable.column]);
    if (type.storage == ColumnType::Storage::kNone)
        throw DataFault("a column of this type can't be used: " + type.kind, variable.name);
    if (type.IsText() && variable.use != Variable::Use::kCategory)
        throw DataFault("the column holds texts, not numbers", variable.name);
    return type;
}

} // namespace

TableBlocks::TableBlocks(Batches* batches, std::vector<Variable>& variables)
    : fBatches(batches), fVariables(variables), fTypes(variables.size())
{
    for (std::size_t i = 0; i < variables.size(); ++i)
    {
        if (variables[i].column >= 0)
        {
            if (batches == nullptr)
                throw DataFault("there is no table with the column", variables[i].name);
            fTypes[i] = CheckType(batches->GetSchema(), variables[i]);
            continue;
        }
        const auto length = static_cast<std::int64_t>(variables[i].array.length);
        if (fNumArrayRows >= 0 && length != fNumArrayRows)
            throw DataFault("there are " + std::to_string(length) + " values for " + std::to_string(fNumArrayRows) +
                                " rows",
                            variables[i].name);
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
            throw DataFault("the table has " + std::string(fIsAtEnd ? "" : "at least ") + std::to_string(numSeen) +
                            " rows, but there are " + std::to_string(fNumArrayRows) + " values beside it");
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
    for (std::size_t i = 0; i < fVariables.size(); ++i) fReaders.push_back(MakeFieldReader(i, batch));
}

std::unique_ptr<FieldReader> TableBlocks::MakeFieldReader(std::size_t index, const ArrowArray* batch)
{
    Variable& variable = fVariables[index];
    const ColumnType& type = fTypes[index];
    std::unique_ptr<ColumnReader> reader;
    if (batch == nullptr || variable.column < 0) // without batches all variables have arrays
    {
        StridedArray rest = variable.array;
        rest.data = static_cast<const char*>(rest.data) + static_cast<std::ptrdiff_t>(fFirstRow) * rest.stride;
        reader = MakeReader(rest);
    }
    else
    {
        const ArrowArray& column = *batch->children[variable.column];
        DeclareOrder(variable, type, column);
        if (type.IsText() && type.isDictionary)
            return std::make_unique<DictionaryCategoryField>(
                MakePlaceReader(column, type, batch->offset), TextReader(*column.dictionary, type.storage, 0),
                static_cast<std::size_t>(column.dictionary->length), variable);
        if (type.IsText())
            return std::make_unique<TextCategoryField>(TextReader(column, type.storage, batch->offset), variable);
        reader = MakeReader(column, type, batch->offset);
    }
    switch (variable.use)
    {
    case Variable::Use::kCategory:
        return std::make_unique<NumberCategoryField>(std::move(reader), variable);
    case Variable::Use::kWeight:
        return std::make_unique<WeightField>(std::move(reader), variable);
    case Variable::Use::kAttribute:
    case Variable::Use::kCode:
        break;
    }
    return std::make_unique<ValueField>(std::move(reader));
}
