#ifndef MCOBNQRT_BINS_BINS_H
#define MCOBNQRT_BINS_BINS_H

#include "bins/weightgrid.h"

#include <mcobnqrt/mcstatus.h>

#include <cstddef>
#include <cstdint>
#include <memory>
#include <optional>
#include <string>
#include <utility>
#include <vector>

// Bins as plain values, whatever made them: a run of the library, or a file that an earlier run has written. Every form
// of output, in every host, is made from these.

enum class VariableKind
{
    kContinuous,
    kStringCategorical,
    kNumericCategorical,
    kWeight
};

enum class VariableRole
{
    kAttribute,
    kTarget,
    kWeight
};

/// What the numbers of a variable stand for.
enum class ValueKind
{
    kNumber,
    kBoolean,  ///< 0 and 1
    kDate,     ///< days since 1970-01-01
    kTimestamp ///< microseconds since 1970-01-01 00:00 UTC
};

/// What decides which codes the categories of a variable have.
enum class CategoryOrder
{
    kText,    ///< they ascend by their bytes
    kRate,    ///< they ascend by the rate of a target's category, or along what stands for it (OrderByRate)
    kDeclared ///< their column, or the user, has declared the order
};

/// Categories that share a code, as each has less than a share of the weight. A category that was never seen has this
/// code, too.
struct RareCategories
{
    std::size_t code = 0;
    double share = 0.0;
    std::vector<std::string> categories;
};

/// A column of the analysis.
struct Variable
{
    std::string name;
    std::string label;
    VariableKind kind = VariableKind::kContinuous;
    VariableRole role = VariableRole::kAttribute;
    ValueKind valueKind = ValueKind::kNumber;
    std::string timeZone;                ///< of a timestamp: the zone that it is shown in; empty without one
    std::vector<std::string> categories; ///< by code; of a numeric-categorical variable as FormatNumber writes them
    /// Of a categorical variable; nothing where it is not known, and of numbers, which ascend.
    std::optional<CategoryOrder> categoryOrder;
    std::optional<RareCategories> rare;              ///< of a categorical variable that has such
    std::string orderTarget;                         ///< of CategoryOrder::kRate: the name of the target
    WeightRounding rounding = WeightRounding::kNone; ///< of a weight
    bool isScaledToRecords = false;   ///< of a weight: it sums to the number of records that have one above 0
    std::optional<double> weightGrid; ///< of a weight: of what its values were made multiples, if one had to move
    std::vector<std::string>
        missingTexts; ///< of a string-categorical variable all; of others those that are no numbers
    std::vector<double> missingNumbers;
    std::optional<std::pair<double, double>> missingInterval; ///< both ends included; infinite ends are infinities

    bool IsCategorical() const
    {
        return kind == VariableKind::kStringCategorical || kind == VariableKind::kNumericCategorical;
    }
};

struct Bin
{
    double left = 0.0;  ///< -infinity in the first bin
    double right = 0.0; ///< +infinity in the last bin
    double weight = 0.0;
    std::vector<double> weights; ///< by category of the target; empty without a target
};

/// The bins of one attribute, against one target or none. It stands alone: whatever is said about it needs nothing
/// else.
struct AttributeBins
{
    std::shared_ptr<const Variable> attribute; ///< never null
    std::shared_ptr<const Variable> target;    ///< null without one
    bool isRightClosed = true;                 ///< a bin is (left, right], otherwise [left, right)
    MCBinning::MCStatus status;
    /// Different valid values; nothing where records were only counted in bins that were there.
    std::optional<std::int64_t> numDistinct;
    double weight = 0.0;            ///< of the records with a valid value, and a valid target if there is one
    double weightWithMissing = 0.0; ///< of all records
    std::optional<double> minimum;  ///< of the valid values; nothing where there is none, as with an error
    std::optional<double> maximum;
    std::optional<double> modelEntropy; ///< of the target within the bins, in bits; nothing where there are no bins
    std::vector<double> cutPoints;      ///< ascending; of a categorical attribute between codes
    /// The cut points as people read them, where a host knows better than FormatValue(): of timestamps that are shown
    /// in a time zone. Otherwise empty. It is not part of the form in JSON.
    std::vector<std::string> borderTexts;
    std::vector<Bin> bins; ///< one more than cut points, or none where nothing was binned
    /// The records without a valid value, but with a valid category if there is a target; nothing where they are not
    /// known. It has no borders.
    std::optional<Bin> missing;
    /// Of a categorical attribute what each category holds, by code; empty where that is not known. They have no borders.
    std::vector<Bin> categories;
    /// What is added to both weights of a bin, to tell the weight of evidence, where it has no events or no others.
    double smoothing = 0.5;
    bool isEdited = false; ///< a person has changed the bins after they were found

    bool HasBins() const { return !bins.empty(); }

    /// Adds the next bin between its cut points.
    void AddBin(double ownWeight, std::vector<double> ownWeights);
};

enum class Method
{
    kSupervised,
    kEqualFrequency
};

/// How bins were asked for.
struct Settings
{
    Method method = Method::kSupervised;
    bool isRightClosed = true;
    int numBins = 0; ///< of equal frequency; in a supervised run of pre-bins
    std::optional<int>
        maxDistinct; ///< supervised: an attribute with more distinct values is pre-binned; nothing: never
    std::optional<double> smallBinRatio; ///< supervised: the ratio to the lighter neighbour below which a bin is merged
    double smoothing = 0.5;              ///< that of the results
    bool areCutsRounded = false;         ///< a cut point is the shortest decimal between the values beside it
};

/// How records were reduced to groups of equal values, each with its weight, before they were binned; or why not.
struct Reduction
{
    std::string engine;                  ///< what has reduced them; empty if they were binned one by one after all
    std::string reason;                  ///< why the one or the other was chosen; empty if it was asked for
    std::int64_t numQueries = 0;         ///< that the engine has run
    bool isDistinctExact = true;         ///< otherwise the numbers of distinct values above `numGroups` are estimates
    std::vector<std::int64_t> numGroups; ///< that were binned, by result
};

/// The bins of all attributes of a run.
struct Bins
{
    std::string componentVersion;
    Settings settings;
    std::optional<std::string> dataName;
    std::optional<std::int64_t> numRecords;              ///< read, whatever their weight
    std::optional<std::int64_t> numRecordsWithoutWeight; ///< they count nowhere; nothing without a weight
    std::vector<std::string> missingTexts;               ///< of all columns of a text file
    std::vector<std::shared_ptr<const Variable>> variables;
    MCBinning::MCStatus status;
    std::vector<AttributeBins> results; ///< in the order in which they were binned
    std::optional<Reduction> reduction; ///< nothing where no reduction was thought of
};

#endif
