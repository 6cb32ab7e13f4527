#ifndef MCBIN_RECORDSOURCE_H
#define MCBIN_RECORDSOURCE_H

#include "bins/infinitevalues.h"
#include "bins/weightgrid.h"
#include "hosts/mcbin/input/mergewatch.h"

#include <mcobnqrt/ibinrecordsource.h>
#include <mcobnqrt/mccommon.h>

#include <cstddef>
#include <string>
#include <string_view>
#include <vector>

class Categories;
class CsvRow;
class Progress;
class TableReader;
struct Column;
struct ColumnPlan;
struct Variables;

/// The rows of a table as records of the variables, read as they are asked for. Weights are on their grid, and infinite
/// values are those that the library takes for them.
///
/// All operations throw a Failure where a row can't be read or isn't what it was when the variables were made.
class TableRecordSource : public IBINRecordSource
{
public:
    /// `table` has been read to its end once, to complete `plan`, from which `variables` have been made. All are the
    /// caller's and outlive this object.
    TableRecordSource(TableReader& table, const ColumnPlan& plan, Variables& variables, Progress& progress);

    bool HasNext() override;

    /// Null at the end. It is the same record each time.
    const MCCommon::Record* Next() override;

    /// How many of the records handed out have a weight above 0, before it is rounded.
    long CountWeighted() const { return fNumWeighted; }

    const WeightGrid& GetWeightGrid() const { return fWeightGrid; }

    /// The values that have been read, by variable index.
    const std::vector<InfiniteValues>& GetValues() const { return fValues; }

    /// By variable index: whether different whole numbers have become one.
    const MergeWatch& GetMergeWatch(std::size_t index) const { return fFields[index].merges; }

private:
    struct Field
    {
        std::size_t position; ///< of the column in the table
        const Column* column;
        Categories* categories; ///< null for a number
        MergeWatch merges;
    };

    double Convert(Field& field, std::string_view text, InfiniteValues& values);
    double ConvertNumber(const Field& field, double number, InfiniteValues& values);
    double ConvertCategory(Field& field, std::string_view text);

    TableReader& fTable;
    const ColumnPlan& fPlan;
    Progress& fProgress;
    WeightGrid fWeightGrid;
    std::vector<InfiniteValues> fValues; ///< by variable index
    std::vector<Field> fFields;          ///< by variable index
    const CsvRow* fRow = nullptr;        ///< what HasNext() has found for Next(); null if it hasn't looked
    long fRowsLeft;                      ///< how many more rows there should be
    long fNumWeighted = 0;
    MCCommon::Record fRecord;
};

#endif
