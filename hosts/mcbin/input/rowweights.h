#ifndef MCBIN_ROWWEIGHTS_H
#define MCBIN_ROWWEIGHTS_H

#include "bins/binner.h"
#include "bins/bins.h"
#include "bins/weightgrid.h"

#include <cstddef>
#include <optional>
#include <string>
#include <vector>

class CsvRow;
class Progress;
class TableReader;

/// The weights of the rows of a table, on the grid that makes all sums exact.
class RowWeights
{
public:
    /// Each row weighs 1.
    RowWeights() = default;
    /// Reads the whole table for the grid, and goes back to its first row.
    /// \param weight the variable that the column of this name holds.
    /// \throw Failure if there is no such column, or a weight can't be used and `isBadMissing` is false.
    RowWeights(TableReader& table, const Variable& weight, const std::vector<std::string>& missingTexts,
               bool isBadMissing, Progress& progress);
    RowWeights(const RowWeights&) = delete;
    RowWeights& operator=(const RowWeights&) = delete;

    /// Nothing if it is missing.
    std::optional<double> Get(const CsvRow& row);

    /// That of the grid; nothing if no weight had to move.
    std::optional<double> GetStep() const { return fGrid ? fGrid->GetStep() : std::nullopt; }

private:
    std::optional<double> Parse(const CsvRow& row);

    const TableReader* fTable = nullptr; ///< null if each row weighs 1
    std::size_t fPosition = 0;
    bool fIsBadMissing = false;
    AttributeBins fAsAttribute;
    std::optional<Binner> fBinner;
    std::optional<WeightGrid> fGrid;
};

#endif
