#include "hosts/mcbin/notes.h"

#include "bins/bins.h"
#include "bins/numbers.h"
#include "hosts/mcbin/input/columnplan.h"
#include "hosts/mcbin/input/recordsource.h"
#include "hosts/mcbin/input/variables.h"
#include "hosts/mcbin/text.h"

#include <fmt/format.h>

#include <algorithm>
#include <optional>
#include <utility>

namespace
{

std::string DescribeMerged(const Column& column, const std::pair<std::string, std::string>& numbers)
{
    return fmt::format("warning: column {}: {} and {} count as one value, as whole numbers are told apart up to 2^53 "
                       "only; --exclude leaves an identifier out",
                       Quote(column.name), Shorten(numbers.first), Shorten(numbers.second));
}

/// The weight of all records, or nothing if no result tells of it.
std::optional<double> FindTotalWeight(const Bins& bins)
{
    const auto isFound = [](const AttributeBins& result) { return !result.status.IsError(); };
    const auto found = std::find_if(bins.results.begin(), bins.results.end(), isFound);
    return found == bins.results.end() ? std::nullopt : std::optional(found->weightWithMissing);
}

/// N of the criterion is the sum of the weights: the larger it is, the less gain a cut needs to be accepted.
std::string DescribeWeights(double weight, long records)
{
    return fmt::format("note: {} records have weights that sum to {}, and the criterion takes a weight as a number of "
                       "records, so it cuts {} readily than {} records would justify; where the weights are no such "
                       "numbers, --weight-scale rows makes them sum to {}",
                       records, FormatWeight(weight), weight > static_cast<double>(records) ? "more" : "less", records,
                       records);
}

/// A note on a column with texts that has no fault: either the column is left out, or its texts count as missing.
std::string DescribeOrnamented(const Column& column)
{
    return fmt::format("note: column {} {}, but looks like numbers, such as {}; {}", Quote(column.name),
                       column.IsUsed() ? "has texts, which count as missing" : "is left out as text",
                       Quote(Shorten(column.firstOrnamented)), kPlainNumbers);
}

} // namespace

std::vector<std::string> MakeNotes(const Bins& bins, const ColumnPlan& plan, const Variables& variables,
                                   const TableRecordSource& source)
{
    constexpr double kFar = 2.0;
    std::vector<std::string> notes;
    for (const Column& column : plan.columns)
    {
        if (column.IsOrnamented())
            notes.push_back(DescribeOrnamented(column));
    }
    for (std::size_t i = 0; i < variables.columns.size(); ++i)
    {
        const Column& column = plan.columns[variables.columns[i]];
        if (const MergeWatch::Merged& merged = source.GetMergeWatch(i).GetMerged(); merged && column.isAttribute)
            notes.push_back(DescribeMerged(column, *merged));
    }
    const std::optional<double> weight = FindTotalWeight(bins);
    const auto records = static_cast<double>(source.CountWeighted());
    if (bins.settings.method == Method::kSupervised && weight && records > 0.0 &&
        (*weight > kFar * records || *weight < records / kFar))
        notes.push_back(DescribeWeights(*weight, source.CountWeighted()));
    return notes;
}
