#ifndef MCOBNQRT_BINRECORDBUFFER_H
#define MCOBNQRT_BINRECORDBUFFER_H

#include <vector>

/// The memory in front of the temporary files: a matrix of doubles with one row for each position of a processed record
/// and a fill count for each row. Positions fill at different speeds once one of them has dropped out of the pass.
class BINRecordBuffer
{
public:
    /// Makes all rows empty, with room for `cols` values each. False if a size is negative or the memory
    /// doesn't suffice.
    bool Init(int rows, int cols);

    /// Stores the value behind the last one of the row. False, with nothing done, for a row that doesn't exist or
    /// is full.
    bool Append(int row, double value);

    /// True from the moment when some row has no room left, up to Reset().
    bool IsFull() const { return fIsFull; }

    /// Empties all rows; the memory stays.
    void Reset();

    /// The values of a row, RowFill(row) of them; null and 0 for a row that doesn't exist.
    const double* RowData(int row) const;
    int RowFill(int row) const;

private:
    bool HasRow(int row) const;

    bool fIsFull = false; ///< some row has no room left
    int fRows = 0;
    int fCols = 0;             ///< capacity of each row, in values
    std::vector<double> fData; ///< row after row: (row, column) lies at row * fCols + column
    std::vector<int> fFill;    ///< by row: number of values held
};

#endif
