#include "bins/evaluation.h"

#include "bins/measures.h"
#include "bins/numbers.h"
#include "bins/text.h"

#include <algorithm>
#include <cmath>
#include <utility>

namespace
{

/// That of the missing, or one without weight.
BinRow FindMissing(const std::vector<BinRow>& rows, const AttributeBins& bins)
{
    for (const BinRow& row : rows)
    {
        if (row.kind == BinRow::Kind::kMissing)
            return row;
    }
    BinRow row;
    row.kind = BinRow::Kind::kMissing;
    row.label = "missing";
    row.bin.weights.resize(bins.target ? bins.target->categories.size() : 0);
    return row;
}

double ComputePart(const Bin& first, double firstTotal, const Bin& second, double secondTotal, double smoothing)
{
    const bool isOneSided = (first.weight == 0.0) != (second.weight == 0.0);
    const double added = isOneSided ? smoothing : 0.0;
    const double a = ComputeShare(second.weight + added, secondTotal);
    const double b = ComputeShare(first.weight + added, firstTotal);
    return a == b ? 0.0 : (a - b) * std::log(a / b);
}

/// Fills the shares of the rows and their parts of the index; the last row is the total.
void FillStability(std::vector<EvaluationRow>& rows, double smoothing)
{
    const double first = rows.back().first.bin.weight;
    const double second = rows.back().second.bin.weight;
    for (EvaluationRow& row : rows) row.second.share = ComputeShare(row.second.bin.weight, second);
    if (!(first > 0.0 && second > 0.0))
        return;
    double sum = 0.0;
    for (EvaluationRow& row : rows)
    {
        row.stability = ComputePart(row.first.bin, first, row.second.bin, second, smoothing);
        if (row.first.kind != BinRow::Kind::kTotal)
            sum += *row.stability;
    }
    rows.back().stability = sum;
}

/// The total that counts the records of unseen categories, too, which have no evidence.
void AddUnseen(std::vector<EvaluationRow>& rows, const Bin& unseen, std::size_t numFirst)
{
    EvaluationRow row;
    row.first.bin.weights.resize(numFirst);
    row.first.kind = row.second.kind = BinRow::Kind::kUnseen;
    row.first.label = row.second.label = "unseen";
    row.second.bin = unseen;
    if (!unseen.weights.empty() && unseen.weights.size() == 2)
        row.second.evidence = Evidence{ComputeShare(unseen.weights[1], unseen.weight), 0.0, 0.0};
    rows.insert(rows.end() - 1, row);
    Bin& total = rows.back().second.bin;
    total.weight += unseen.weight;
    for (std::size_t code = 0; code < unseen.weights.size(); ++code) total.weights[code] += unseen.weights[code];
}

} // namespace

Evaluation BeginEvaluation(Bins first)
{
    Evaluation evaluation;
    evaluation.second.componentVersion = first.componentVersion;
    evaluation.second.settings = first.settings;
    evaluation.second.missingTexts = first.missingTexts;
    evaluation.second.variables = first.variables;
    evaluation.first = std::move(first);
    return evaluation;
}

void AddResults(Evaluation& whole, const Evaluation& part)
{
    const auto append = [](auto& all, const auto& further) { all.insert(all.end(), further.begin(), further.end()); };
    append(whole.second.results, part.second.results);
    append(whole.indices, part.indices);
    append(whole.strangers, part.strangers);
    append(whole.ranges, part.ranges);
}

std::vector<EvaluationRow> MakeRows(const Evaluation& evaluation, std::size_t index)
{
    const AttributeBins& first = evaluation.GetFirst(index);
    const AttributeBins& second = evaluation.GetSecond(index);
    const std::vector<BinRow> ofFirst = MakeRows(first);
    const std::vector<BinRow> ofSecond = MakeRows(second);
    std::vector<EvaluationRow> rows;
    for (std::size_t i = 0; i < first.bins.size(); ++i) rows.push_back({ofFirst[i], ofSecond[i], std::nullopt});
    if (HasMissing(first) || HasMissing(second))
        rows.push_back({FindMissing(ofFirst, first), FindMissing(ofSecond, second), std::nullopt});
    rows.push_back({ofFirst.back(), ofSecond.back(), std::nullopt});
    if (const Bin& unseen = evaluation.strangers[index].unseen; unseen.weight > 0.0)
        AddUnseen(rows, unseen, ofFirst.back().bin.weights.size());
    FillStability(rows, evaluation.first.settings.smoothing);
    return rows;
}

std::optional<double> ComputeStability(const Evaluation& evaluation, std::size_t index)
{
    return MakeRows(evaluation, index).back().stability;
}

std::vector<std::string> FindFlags(const Evaluation& evaluation, std::size_t index)
{
    std::vector<std::string> flags;
    const double stability = ComputeStability(evaluation, index).value_or(0.0);
    if (stability >= kDrifting)
        flags.emplace_back(stability >= kShifted ? "the population has shifted" : "the population drifts");
    const Strangers& strangers = evaluation.strangers[index];
    if (strangers.unseen.weight > 0.0)
    {
        std::vector<std::string> names;
        for (const std::string& name : strangers.unseenCategories) names.push_back(Quote(Shorten(name)));
        flags.push_back("categories that the bins do not know" + (names.empty() ? "" : ": " + Join(names, ", ")));
    }
    return flags;
}

bool IsFlagged(const Evaluation& evaluation)
{
    for (std::size_t i = 0; i < evaluation.second.results.size(); ++i)
    {
        if (!FindFlags(evaluation, i).empty())
            return true;
    }
    return evaluation.weightOfUnseenTargets > 0.0;
}
