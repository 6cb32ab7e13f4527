#include "tests/fuzz/recount.h"

#include "tests/fuzz/check.h"

#include <algorithm>
#include <cmath>
#include <cstddef>
#include <limits>
#include <set>
#include <string>

using MCMV::gMissingValue;

namespace
{

constexpr double kLargest = std::numeric_limits<double>::max();

/// A record that has a value of the attribute, and of the target if there is one.
struct Case
{
    double value;
    std::size_t code;
    double weight;
};

struct Truth
{
    std::vector<Case> cases;
    double total = 0.0;
    double totalWithMissing = 0.0;
    bool isExact = true; ///< every sum of weights is exact in any order
    std::set<double> values;
    std::set<std::size_t> codes;
};

bool IsCategorical(const BINVarList& list, int variable)
{
    const IBINVariable::MeasureLevel level = list.GetVarAt(variable)->GetMeasureLevel();
    return level == IBINVariable::MeasureNumericCategorical || level == IBINVariable::MeasureStringCategorical;
}

/// Whether the library takes the fields of the variable for codes, as it does with those of the list's target, whatever
/// its level is.
bool HasCodes(const BINVarList& list, int variable)
{
    return IsCategorical(list, variable) || variable == list.GetTargetIndex();
}

double FieldOf(const std::vector<double>& record, int variable)
{
    return static_cast<std::size_t>(variable) < record.size() ? record[static_cast<std::size_t>(variable)]
                                                              : gMissingValue;
}

bool IsUserMissing(const BINVarList& list, int variable, double value)
{
    const auto* const missing =
        dynamic_cast<const BINNumericUserMissing*>(list.GetVarAt(variable)->GetUserMissingInfo());
    if (missing == nullptr)
        return false;
    for (const double declared : missing->GetDiscreteValues())
    {
        if (value == declared)
            return true;
    }
    const BINNumericInterval* const interval = missing->GetInterval();
    return interval != nullptr && value >= interval->GetLeftEnd() && value <= interval->GetRightEnd();
}

/// What the record weighs; 0 for one that counts nowhere.
double WeightOf(const HostData& data, const std::vector<double>& record)
{
    const int variable = data.list.GetWeightIndex();
    if (variable < 0)
        return 1.0;
    double weight = FieldOf(record, variable);
    if (weight == gMissingValue || IsUserMissing(data.list, variable, weight))
        return 0.0;
    if (data.rounding == IBINVariable::RoundTruncate)
        weight = std::floor(weight);
    if (data.rounding == IBINVariable::RoundClosest)
        weight = std::floor(weight + 0.5);
    return weight > 0.0 ? weight : 0.0;
}

bool IsMissing(const HostData& data, const std::vector<double>& record, int variable)
{
    const double field = FieldOf(record, variable);
    if (field == gMissingValue)
        return true;
    if (variable == data.list.GetTargetIndex())
        return field > -2.0 && field <= -1.0; // its whole part counts
    if (IsCategorical(data.list, variable))
        return field == -1.0;
    return std::isnan(field) || IsUserMissing(data.list, variable, field);
}

/// Whether the weights are whole numbers or k/16, and few and small enough for every sum to be exact.
bool IsExact(double weight)
{
    return weight * 16.0 == std::floor(weight * 16.0) && weight < 1e9;
}

/// \param target -1 without one.
Truth MakeTruth(const HostData& data, int attribute, int target)
{
    Truth truth;
    for (const std::vector<double>& record : data.records)
    {
        const double weight = record.empty() ? 0.0 : WeightOf(data, record);
        if (weight == 0.0)
            continue;
        truth.isExact = truth.isExact && IsExact(weight);
        truth.totalWithMissing += weight;
        if (IsMissing(data, record, attribute) || (target >= 0 && IsMissing(data, record, target)))
            continue;
        const std::size_t code = target >= 0 ? static_cast<std::size_t>(FieldOf(record, target)) : 0;
        truth.cases.push_back({FieldOf(record, attribute), code, weight});
        truth.total += weight;
        truth.values.insert(truth.cases.back().value);
        truth.codes.insert(code);
    }
    return truth;
}

/// One more than the largest code that the variable has in a record that counts. 0 if a code fits no variable.
std::size_t CountCodes(const HostData& data, int variable)
{
    std::size_t number = 1;
    for (const std::vector<double>& record : data.records)
    {
        if (record.empty() || WeightOf(data, record) == 0.0 || IsMissing(data, record, variable))
            continue;
        const double code = FieldOf(record, variable);
        if (!(code > -1.0 && code < 256.0))
            return 0;
        number = std::max(number, static_cast<std::size_t>(code) + 1);
    }
    return number;
}

/// Whether all codes of a variable are such that it may be analysed.
bool IsUsable(const HostData& data, int variable)
{
    const std::size_t number = HasCodes(data.list, variable) ? CountCodes(data, variable) : 1;
    const bool isDeclared = !IsCategorical(data.list, variable) ||
                            number <= static_cast<std::size_t>(data.list.GetVarAt(variable)->GetNumberOfCategories());
    return number > 0 && isDeclared;
}

/// An attribute may have codes that were not declared, but none that doesn't fit.
void CheckCodes(const HostData& data, int attribute)
{
    Check(!HasCodes(data.list, attribute) || CountCodes(data, attribute) > 0, "codes that don't fit were binned");
}

bool HasVariable(const HostData& data, int variable)
{
    return variable >= 0 && variable < static_cast<int>(data.list.Size());
}

std::size_t PlaceOf(const std::vector<double>& cuts, bool isRightClosed, double value)
{
    std::size_t bin = 0;
    while (bin < cuts.size() && !(isRightClosed ? value <= cuts[bin] : value < cuts[bin])) ++bin;
    return bin;
}

/// Sums that are not exact may differ in their last bits, by the order of adding and by what a subtraction leaves.
void CheckWeight(const Truth& truth, double expected, double actual, const char* words)
{
    const bool isSame =
        truth.isExact ? expected == actual : std::fabs(expected - actual) <= 1e-10 * truth.totalWithMissing;
    if (!isSame)
        Fail(words + (": " + std::to_string(expected)) + " by the records, " + std::to_string(actual) + " told");
}

/// What both kinds of results tell beside their bins.
template<class Results>
void CheckFigures(const Truth& truth, const Results& result)
{
    CheckWeight(truth, truth.total, result.GetTotalWeight(), "total weight");
    CheckWeight(truth, truth.totalWithMissing, result.GetTotalWeightWithMissing(), "total weight with missing");
    Check(result.GetNDistinctValues() == truth.values.size(), "number of distinct values");
    Check(result.GetMinimum() == (truth.values.empty() ? gMissingValue : *truth.values.begin()), "minimum");
    Check(result.GetMaximum() == (truth.values.empty() ? gMissingValue : *truth.values.rbegin()), "maximum");
    const std::vector<double>& cuts = result.GetCutPoints();
    for (std::size_t i = 0; i < cuts.size(); ++i)
        Check(!std::isnan(cuts[i]) && (i == 0 || cuts[i - 1] < cuts[i]), "the cut points don't rise");
}

void CheckNumBins(const Truth& truth, std::size_t numBinsWithValues)
{
    Check(numBinsWithValues <= std::max<std::size_t>(truth.values.size(), 1), "more bins than distinct values");
}

/// What the records weigh by bin and code.
std::vector<std::vector<double>> Recount(const Truth& truth, const std::vector<double>& cuts, bool isRightClosed,
                                         std::size_t numCodes)
{
    std::vector<std::vector<double>> table(cuts.size() + 1, std::vector<double>(numCodes, 0.0));
    for (const Case& one : truth.cases) table[PlaceOf(cuts, isRightClosed, one.value)][one.code] += one.weight;
    return table;
}

double PlainEntropy(const std::vector<double>& weights)
{
    double total = 0.0;
    for (const double weight : weights) total += weight;
    double entropy = 0.0;
    for (const double weight : weights)
    {
        if (weight > 0.0)
            entropy -= weight / total * std::log2(weight / total);
    }
    return entropy;
}

void CheckModelEntropy(const Truth& truth, const std::vector<std::vector<double>>& table, double modelEntropy)
{
    double expected = 0.0;
    for (const std::vector<double>& bin : table)
    {
        double weight = 0.0;
        for (const double cell : bin) weight += cell;
        expected += PlainEntropy(bin) * weight;
    }
    expected /= truth.total;
    Check(std::fabs(expected - modelEntropy) < 1e-9, "model entropy");
}

/// An error has to have a reason, which is in the list or in the codes.
void CheckError(const HostData& data, const MCBinning::MCStatus& status, int attribute, int target)
{
    switch (status.GetErrorCode())
    {
    case MCBinning::BINStatusBadAttributeIndex:
        Check(!HasVariable(data, attribute), "the attribute is there");
        break;
    case MCBinning::BINStatusIndexOutOfRange:
        Check(!HasVariable(data, attribute) || !HasVariable(data, target), "both variables are there");
        break;
    case MCBinning::BINStatusTargetNotCategorical:
        Check(!IsCategorical(data.list, target), "the target is categorical");
        break;
    case MCBinning::BINStatusRoleConflict:
        Check(attribute == target || attribute == data.list.GetWeightIndex() || target == data.list.GetWeightIndex() ||
                  attribute == data.list.GetTargetIndex(),
              "the roles don't conflict");
        break;
    case MCBinning::BINStatusTargetUnusable:
        Check(target < 0 || !IsUsable(data, target), "the target is usable");
        break;
    case MCBinning::BINStatusTooManyCategories:
        Check(CountCodes(data, attribute) == 0, "all codes of the attribute fit");
        break;
    default:
        Fail("a result with the error " + std::to_string(status.GetErrorCode()));
    }
}

} // namespace

void CheckResult(const HostData& data, const BINAttributeTargetResults& result)
{
    const int attribute = result.GetAttributeIndex();
    const int target = result.GetTargetIndex();
    const MCBinning::MCStatus& status = result.GetStatus();
    if (status.IsError())
    {
        CheckError(data, status, attribute, target);
        Check(result.GetCutPoints().empty(), "cut points with an error");
        return;
    }
    Check(IsUsable(data, target), "a target that is not usable was used");
    CheckCodes(data, attribute);
    const Truth truth = MakeTruth(data, attribute, target);
    CheckFigures(truth, result);
    Check((status.GetErrorCode() == MCBinning::BINStatusNoValidValues) == truth.cases.empty(), "no valid values");
    if (status.GetErrorCode() == MCBinning::BINStatusBadBinTable)
        Check(result.GetMaximum() >= kLargest, "no reason for a bad table");
    if (truth.cases.empty() || result.GetMaximum() >= kLargest)
        return; // where the largest value fits no row there is no table

    const std::size_t numCodes = CountCodes(data, target);
    const std::vector<std::vector<double>>& cells = result.GetCellCounts();
    Check(cells.size() == result.GetCutPoints().size() + 1, "number of bins");
    const std::vector<std::vector<double>> expected =
        Recount(truth, result.GetCutPoints(), data.isRightClosed, numCodes);
    // A pre-bin can be empty, and the criterion can cut it off where the threshold is below 0 or below what rounding
    // has left of the gain.
    const bool isPreBinned =
        data.distinctThreshold != 0 && result.GetNDistinctValues() > static_cast<unsigned int>(data.distinctThreshold);
    std::size_t numBinsWithValues = 0;
    for (std::size_t bin = 0; bin < cells.size(); ++bin)
    {
        Check(cells[bin].size() == numCodes + 1, "number of cells");
        double weight = 0.0;
        for (std::size_t code = 0; code < numCodes; ++code)
        {
            CheckWeight(truth, expected[bin][code], cells[bin][code + 1], "cell");
            weight += cells[bin][code + 1];
        }
        CheckWeight(truth, weight, cells[bin][0], "weight of a bin");
        Check(cells[bin][0] > 0.0 || (isPreBinned && cells[bin][0] == 0.0), "an empty bin");
        numBinsWithValues += cells[bin][0] > 0.0 ? 1 : 0;
    }
    CheckNumBins(truth, numBinsWithValues);
    if (truth.isExact)
        CheckModelEntropy(truth, expected, result.GetModelEntropy());
}

void CheckResult(const HostData& data, const BINAttributeResults& result)
{
    const MCBinning::MCStatus& status = result.GetStatus();
    if (status.IsError())
    {
        CheckError(data, status, result.GetAttributeIndex(), -1);
        Check(result.GetCutPoints().empty() && result.GetCellCounts().empty(), "bins with an error");
        return;
    }
    CheckCodes(data, result.GetAttributeIndex());
    const Truth truth = MakeTruth(data, result.GetAttributeIndex(), -1);
    CheckFigures(truth, result);
    Check((status.GetErrorCode() == MCBinning::BINStatusNoValidValues) == truth.cases.empty(), "no valid values");
    if (truth.cases.empty())
        return;

    const std::vector<double>& counts = result.GetCellCounts();
    Check(counts.size() == result.GetCutPoints().size() + 1, "number of bins");
    const std::vector<std::vector<double>> expected = Recount(truth, result.GetCutPoints(), data.isRightClosed, 1);
    for (std::size_t bin = 0; bin < counts.size(); ++bin)
    {
        CheckWeight(truth, expected[bin][0], counts[bin], "weight of a bin");
        Check(counts[bin] > 0.0, "an empty bin");
    }
    CheckNumBins(truth, counts.size());
}
