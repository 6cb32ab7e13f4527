#include "recordsource.h"

#include "numbers.h"
#include "tablereader.h"
#include "variables.h"

#include <mcobnqrt/binstringencoder.h>

#include <optional>
#include <utility>

namespace
{

constexpr const char* kChanged = "the file has changed while it was read";

} // namespace

TableRecordSource::TableRecordSource(TableReader& table, const Variables& variables, long nRows)
    : fTable(table), fRowsLeft(nRows), fRecord(static_cast<int>(variables.columns.size()))
{
    // Every encoder is of strings, as only targets are categorical.
    for (std::size_t i = 0; i < variables.columns.size(); ++i)
        fFields.push_back({variables.columns[i],
                           static_cast<const BINStringEncoder*>(variables.list.GetEncoderAt(static_cast<int>(i)))});
    fTable.Rewind();
}

bool TableRecordSource::HasNext()
{
    if (fRow)
        return true;
    fRow = fTable.NextRow();
    if (fRow ? fRowsLeft == 0 : fRowsLeft != 0)
        throw fTable.MakeFailure(kChanged);
    return fRow != nullptr;
}

const MCCommon::Record* TableRecordSource::Next()
{
    if (!HasNext())
        return nullptr;
    for (std::size_t i = 0; i < fFields.size(); ++i)
        fRecord[static_cast<int>(i)] = Convert(fFields[i], (*fRow)[fFields[i].column]);
    --fRowsLeft;
    fRow = nullptr;
    return &fRecord;
}

double TableRecordSource::Convert(const Field& field, std::string_view text)
{
    if (text.empty())
        return MCMV::gMissingValue;
    if (!field.encoder)
    {
        const std::optional<double> number = ParseNumber(text);
        if (!number)
            throw fTable.MakeFailure(*fRow, kChanged);
        return *number;
    }
    fCategory = text;
    const double code = field.encoder->EncodeConst(fCategory);
    if (code < 0.0)
        throw fTable.MakeFailure(*fRow, kChanged);
    return code;
}
