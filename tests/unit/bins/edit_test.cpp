// Bins that a person changes, and records that are counted in them.

#include "bins/edit.h"

#include "bins/bintally.h"
#include "bins/evaluation.h"
#include "bins/measures.h"
#include "tests/support/samplebins.h"

#include <gtest/gtest.h>

#include <cmath>
#include <limits>
#include <stdexcept>

namespace
{

constexpr double kNaN = std::numeric_limits<double>::quiet_NaN();

AttributeBins FourBins()
{
    const auto target = AVariable("t", VariableKind::kStringCategorical, {"no", "yes"});
    AttributeBins bins = SomeBins(AVariable("x"), target, {1, 2, 3}, {{6, 2}, {4, 4}, {1, 3}, {0, 5}});
    bins.minimum = 0.5;
    bins.maximum = 9.0;
    bins.missing = Bin{kNaN, kNaN, 3.0, {2, 1}};
    bins.weightWithMissing += 3.0;
    return bins;
}

/// An evaluation of FourBins() in which these were counted.
Evaluation Compare(const AttributeBins& second)
{
    Evaluation evaluation;
    evaluation.first.results = {FourBins()};
    evaluation.second.results = {second};
    evaluation.indices = {0};
    evaluation.strangers.resize(1);
    return evaluation;
}

} // namespace

TEST(Edit, JoiningAddsWeightsAndNeedsNoData)
{
    const AttributeBins joined = MergeBins(FourBins(), 1, 2);

    EXPECT_EQ((std::vector<double>{1, 3}), joined.cutPoints);
    ASSERT_EQ(3u, joined.bins.size());
    EXPECT_EQ(12.0, joined.bins[1].weight);
    EXPECT_EQ((std::vector<double>{5, 7}), joined.bins[1].weights);
    EXPECT_EQ(1.0, joined.bins[1].left);
    EXPECT_EQ(3.0, joined.bins[1].right);
    EXPECT_TRUE(joined.isEdited);
    EXPECT_EQ(ComputeModelEntropy(joined), joined.modelEntropy);
    EXPECT_EQ(1u, MergeBins(FourBins(), 0, 3).bins.size());

    for (const auto& [first, last] : {std::pair<std::size_t, std::size_t>(1, 1), {2, 1}, {1, 4}})
        EXPECT_THROW(MergeBins(FourBins(), first, last), std::invalid_argument) << first << ' ' << last;
    EXPECT_THROW(JoinBins(FourBins(), {1, 1}), std::invalid_argument);
    EXPECT_THROW(JoinBins(FourBins(), {3}), std::invalid_argument);
    for (const std::vector<double>& cuts : {std::vector<double>{1, 1}, {2, 1}, {kNaN}, {1, kNaN}})
        EXPECT_THROW(Recut(FourBins(), cuts), std::invalid_argument);
}

TEST(Edit, RecordsThatDoNotFitTheBinsAreToldApart)
{
    const AttributeBins known = FourBins();
    BinTally tally(known, true);
    tally.Add({0, false, 0.25}, 0, 2.0);            // below what the bins were made of
    tally.Add({3, false, 9.0}, 1, 1.0);             // the largest value is no stranger
    tally.Add({3, false, 10.0}, 1, 4.0);            // above
    tally.Add({std::nullopt, true, 0.0}, 1, 8.0);   // an unseen category
    tally.Add({std::nullopt, false, 0.0}, 0, 16.0); // a missing value
    tally.Add({1, false, 1.5}, std::nullopt, 32.0); // a missing category of the target
    for (int i = 0; i < 20; ++i) tally.NameUnseen(std::to_string(i % 15));

    const AttributeBins counted = tally.GetBins();
    EXPECT_EQ(7.0, counted.weight);
    EXPECT_EQ(63.0, counted.weightWithMissing);
    EXPECT_EQ(0.25, counted.minimum);
    EXPECT_EQ(10.0, counted.maximum);
    EXPECT_EQ((std::vector<double>{16, 0}), counted.missing->weights);
    EXPECT_EQ(2.0, tally.GetStrangers().below);
    EXPECT_EQ(4.0, tally.GetStrangers().above);
    EXPECT_EQ((std::vector<double>{0, 8}), tally.GetStrangers().unseen.weights);
    EXPECT_EQ(10u, tally.GetStrangers().unseenCategories.size());

    BinTally withoutTarget(known, false);
    withoutTarget.Add({1, false, 1.5}, std::nullopt, 32.0);
    EXPECT_EQ(nullptr, withoutTarget.GetBins().target);
    EXPECT_EQ(32.0, withoutTarget.GetBins().bins[1].weight);
}

TEST(Evaluation, ThePopulationStabilityIndexIsTheSumOfItsParts)
{
    EXPECT_EQ(0.0, ComputeStability(Compare(FourBins()), 0)) << "a population has not moved from itself";

    AttributeBins second = Recut(FourBins(), {1, 2, 3});
    second.bins[0].weight = 14.0;
    second.bins[1].weight = 14.0;
    const std::vector<EvaluationRow> rows = MakeRows(Compare(second), 0);
    ASSERT_EQ(6u, rows.size()); // with the missing, which the second population does not have, and the total
    EXPECT_DOUBLE_EQ((0.5 - 8.0 / 28.0) * std::log(0.5 / (8.0 / 28.0)), *rows[0].stability);
    EXPECT_DOUBLE_EQ((0.5 / 28.0 - 3.5 / 28.0) * std::log(0.5 / 3.5), *rows[4].stability) << "smoothed";
    double sum = 0.0;
    for (std::size_t i = 0; i + 1 < rows.size(); ++i) sum += *rows[i].stability;
    EXPECT_EQ(sum, *rows.back().stability);
    EXPECT_EQ(std::vector<std::string>{"the population has shifted"}, FindFlags(Compare(second), 0));

    Evaluation unsmoothed = Compare(second);
    unsmoothed.first.settings.smoothing = 0.0;
    EXPECT_EQ(std::numeric_limits<double>::infinity(), ComputeStability(unsmoothed, 0));

    Evaluation strange = Compare(FourBins());
    strange.strangers[0].unseen = Bin{kNaN, kNaN, 28.0, {14, 14}};
    strange.strangers[0].unseenCategories = {"x"};
    const std::vector<EvaluationRow> withUnseen = MakeRows(strange, 0);
    ASSERT_EQ(7u, withUnseen.size());
    EXPECT_EQ(0.5, withUnseen[5].second.share);
    EXPECT_EQ(56.0, withUnseen[6].second.bin.weight);
    EXPECT_EQ(2u, FindFlags(strange, 0).size());
    EXPECT_TRUE(IsFlagged(strange));
    EXPECT_FALSE(IsFlagged(Compare(FourBins())));
    EXPECT_EQ(std::nullopt, ComputeStability(Compare(Recut(FourBins(), {1, 2, 3})), 0)) << "nothing was counted";
}
