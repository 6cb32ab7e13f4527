#ifndef MCBIN_FINDINGS_H
#define MCBIN_FINDINGS_H

#include "hosts/mcbin/options.h"

#include <mcobnqrt/mcstatus.h>

#include <optional>
#include <string>
#include <utility>
#include <vector>

// What a run has found, as plain values. Every form of output is made from it, and it is what the JSON form holds, so
// that it can be read back and applied.

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

struct Variable
{
    std::string name;
    std::string label;
    VariableKind kind = VariableKind::kContinuous;
    VariableRole role = VariableRole::kAttribute;
    std::vector<std::string> categories;   ///< by code; numbers as they are written
    std::string rounding;                  ///< of a weight: "truncate", "closest" or "none"
    std::optional<double> weightGrid;      ///< of a weight: of what its values were made multiples, if one had to move
    std::vector<std::string> missingTexts; ///< of a categorical one, among them numbers; of others, only what is none
    std::vector<double> missingNumbers;
    std::optional<std::pair<double, double>> missingInterval; ///< infinite ends are IEEE infinities

    bool IsCategorical() const
    {
        return kind == VariableKind::kStringCategorical || kind == VariableKind::kNumericCategorical;
    }
};

struct Bin
{
    double left = 0.0;  ///< -infinity in the first
    double right = 0.0; ///< +infinity in the last
    double weight = 0.0;
    std::vector<double> weights; ///< by category of the target; empty without one
};

struct Result
{
    int attribute = -1; ///< place in Findings::variables
    int target = -1;    ///< the same; -1 without one
    MCBinning::MCStatus status;
    long distinctValues = 0;
    double weight = 0.0;
    double weightWithMissing = 0.0;
    std::optional<double> minimum; ///< nothing where a figure wasn't found
    std::optional<double> maximum;
    std::optional<double> targetEntropy; ///< in bits
    std::optional<double> modelEntropy;  ///< in bits
    std::vector<double> cutPoints;
    std::vector<Bin> bins; ///< one more than cut points, or none
};

struct Findings
{
    std::string componentVersion;
    SettingOptions settings; ///< without the temporary directory
    std::string dataName;
    std::optional<long> records;
    std::optional<long> recordsWithoutWeight; ///< they count nowhere; nothing without a weight
    std::vector<std::string> missingText;     ///< of all columns
    std::vector<Variable> variables;
    MCBinning::MCStatus status;
    std::vector<Result> results;
    std::vector<std::string> leftOut; ///< columns of text, with an example each; not part of the JSON form
    std::vector<std::string> notes;   ///< for the user, beside the results; not part of the JSON form either

    const Variable& GetAttribute(const Result& result) const
    {
        return variables[static_cast<std::size_t>(result.attribute)];
    }
    /// Null if the result has no target.
    const Variable* FindTarget(const Result& result) const
    {
        return result.target < 0 ? nullptr : &variables[static_cast<std::size_t>(result.target)];
    }
};

#endif
