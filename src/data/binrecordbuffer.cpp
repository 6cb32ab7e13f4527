#include "data/binrecordbuffer.h"

#include <algorithm>
#include <cstddef>

namespace
{

std::size_t IndexOf(int number)
{
    return static_cast<std::size_t>(number);
}

} // namespace

bool BINRecordBuffer::Init(int rows, int cols)
{
    if (rows < 0 || cols < 0)
        return false;
    try
    {
        std::vector<double> data(IndexOf(rows) * IndexOf(cols));
        std::vector<int> fill(IndexOf(rows), 0);
        fData.swap(data);
        fFill.swap(fill);
    }
    catch (...) // bad_alloc, length_error, or whatever the program's own operator new throws
    {
        return false; // the caller may try a smaller size
    }
    fIsFull = false;
    fRows = rows;
    fCols = cols;
    return true;
}

bool BINRecordBuffer::Append(int row, double value)
{
    if (!HasRow(row) || RowFill(row) == fCols)
        return false;
    int& fill = fFill[IndexOf(row)];
    fData[IndexOf(row) * IndexOf(fCols) + IndexOf(fill)] = value;
    ++fill;
    fIsFull = fIsFull || fill == fCols;
    return true;
}

void BINRecordBuffer::Reset()
{
    std::fill(fFill.begin(), fFill.end(), 0);
    fIsFull = false;
}

const double* BINRecordBuffer::RowData(int row) const
{
    return HasRow(row) ? fData.data() + IndexOf(row) * IndexOf(fCols) : nullptr;
}

int BINRecordBuffer::RowFill(int row) const
{
    return HasRow(row) ? fFill[IndexOf(row)] : 0;
}

bool BINRecordBuffer::HasRow(int row) const
{
    return row >= 0 && row < fRows;
}
