#include "tablereader.h"

#include "texttable.h"

#include <algorithm>

namespace
{

std::vector<std::string> NameColumns(const CsvRow& header)
{
    std::vector<std::string> names;
    for (std::size_t i = 0; i < header.Size(); ++i)
        names.push_back(header[i].empty() ? "column " + std::to_string(i + 1) : std::string(header[i]));
    return names;
}

} // namespace

TableReader::TableReader(const std::string& path) : fReader(path)
{
    const CsvRow* const header = fReader.NextRow();
    if (!header)
        throw MakeFailure("the file is empty; its first line should name the columns");
    fColumnNames = NameColumns(*header);
    for (auto name = fColumnNames.begin(); name != fColumnNames.end(); ++name)
        if (std::find(fColumnNames.begin(), name, *name) != name)
            throw MakeFailure(*header, "two columns are named " + Quote(*name));
}

std::size_t TableReader::FindColumn(const std::string& name) const
{
    const auto place = std::find(fColumnNames.begin(), fColumnNames.end(), name);
    if (place != fColumnNames.end())
        return static_cast<std::size_t>(place - fColumnNames.begin());
    std::string columns;
    for (const std::string& column : fColumnNames) columns += (columns.empty() ? "" : ", ") + Quote(column);
    throw MakeFailure("no column is named " + Quote(name) + "; there are " + columns);
}

const CsvRow* TableReader::NextRow()
{
    const CsvRow* const row = fReader.NextRow();
    if (row && row->Size() != fColumnNames.size())
        throw MakeFailure(*row, "wrong number of fields: " + std::to_string(row->Size()) + ", but the header has " +
                                    std::to_string(fColumnNames.size()));
    return row;
}

void TableReader::Rewind()
{
    fReader.Rewind();
    fReader.NextRow(); // the header is known
}

Failure TableReader::MakeFailure(const std::string& words) const
{
    return Failure(fReader.GetPath() + ": " + words);
}

Failure TableReader::MakeFailure(const CsvRow& row, const std::string& words) const
{
    return Failure(fReader.GetPath() + ", line " + std::to_string(row.GetLine()) + ": " + words);
}
