#ifndef MCBINNING_FEED_H
#define MCBINNING_FEED_H

#include "bins/bins.h"
#include "bins/categoryorder.h"
#include "bins/weightgrid.h"
#include "hosts/python/src/arrays.h"
#include "hosts/python/src/batches.h"
#include "hosts/python/src/counting.h"
#include "hosts/python/src/field.h"
#include "hosts/python/src/runs.h"
#include "hosts/python/src/spool.h"
#include "hosts/python/src/tableblocks.h"

#include <nanobind/nanobind.h>

#include <cstdint>
#include <memory>
#include <optional>
#include <string>
#include <utility>
#include <vector>

/// A stream of batches, for Python to hold.
struct Table
{
    std::unique_ptr<Batches> batches;
};

/// The records of one analysis: a table, arrays, or both side by side. A table can be read once, by one of the
/// operations that read records.
class Feed
{
public:
    /// \param table a Table, or None.
    explicit Feed(nanobind::object table) : fTable(std::move(table)) {}

    /// Its values are in a column of the table or in the array, which has one for each record. With `isOptional` more
    /// categories than a run takes are no error.
    /// \return its index.
    std::size_t AddField(const std::string& name, const std::string& use, int column, const std::optional<Array>& array,
                         const std::string& rounding, bool isScaled, bool isOptional);

    void DeclareMissing(std::size_t index, const std::vector<double>& values,
                        std::optional<std::pair<double, double>> interval, const std::vector<std::string>& texts);

    /// Tells all categories that there will be, by code, and what another one is: "changed", "error" or "missing".
    void SetCategories(std::size_t index, const nanobind::list& categories, const std::string& unseen);

    /// Tells what the numbers of a field without a column stand for.
    void SetValueKind(std::size_t index, const std::string& kind);

    /// The categories: by code where all have been told, else those known by now, in the order that their column
    /// declares or else in ascending order.
    nanobind::list GetCategories(std::size_t index) const;

    /// Once the records have been read for it: why the field, a column of text, is not binned unless it is named.
    std::string DescribeUnusable(std::size_t index) const;

    /// Leaves the field out. Later ones move down by one.
    void Drop(std::size_t index);

    /// Reads the records, whose categories and weights are known, for the weights of the attributes' categories, and
    /// gives each of these pairs of fields codes for the attribute, whose categories are texts.
    std::vector<CategoryCodes> CountCategories(const std::vector<std::pair<int, std::optional<int>>>& pairs,
                                               double rareShare, bool isByRate);

    /// Tells the codes of the categories, which are texts, the share below which they are rare, and what has decided on
    /// their order.
    void SetCodes(std::size_t index, const CategoryCodes& codes, double rareShare, const std::string& order,
                  const std::string& target);

    /// Tells the code of a category that is not among those that were told.
    void SetUnseenCode(std::size_t index, std::size_t code) { fFields.at(index).unseenCode = code; }

    /// How many weights are above 0, and the largest. Known once the records have been read for it, and where they
    /// were read by another feed, from there.
    std::pair<std::int64_t, double> GetWeights() const;
    void SetWeights(const std::pair<std::int64_t, double>& weights, double scale);

    /// Scales the weights, whose tally is known, to the number of records that have one above 0, for which it reads
    /// all records. \return the scale.
    double ScaleWeights();

    /// Reads the records for their categories and weights alone.
    void Learn();

    /// Reads the records for their categories and weights, and keeps them in a nameless file for the run.
    void SpoolRecords(const std::string& directory);

    /// The next records, `maxRows` or a few more: for each field an array with its numbers or codes, NaN for what is
    /// missing. The arrays are empty at the end.
    nanobind::list Read(std::size_t maxRows);

    /// The bins of a run before it has found any: what is known of the fields.
    /// \param target the index of the field that is the target of all attributes, if they have one.
    Bins Describe(const Settings& settings, std::optional<int> target,
                  const std::optional<std::string>& dataName) const;

    /// \param progress is called with a phase and an index, or None.
    Bins Bin(const Settings& settings, const RunRequest& request, const std::optional<std::string>& dataName,
             const nanobind::object& progress);

    /// Counts the records in bins that are there already; `areGroups` is that of CountRecords().
    Evaluation Count(Bins first, const std::vector<Counted>& counted, const std::optional<std::string>& dataName,
                     bool areGroups);

private:
    /// All records, from the first on. `table` holds what reads them, if they are not kept in a file.
    BlockSource& OpenBlocks(std::optional<TableBlocks>& table);

    Batches* GetBatches() const;
    void TallyArray();
    WeightTally GetTally();

    nanobind::object fTable;
    std::vector<Field> fFields;
    std::vector<std::optional<Array>> fArrays; ///< keep alive what the fields borrow
    std::optional<WeightTally> fWeights;
    std::unique_ptr<Spool> fSpool;
    std::optional<TableBlocks> fReading; ///< where Read has got to
};

#endif
