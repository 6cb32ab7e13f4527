#include "bins/rows.h"

#include "tests/support/samplebins.h"

#include <gtest/gtest.h>

#include <cmath>
#include <limits>

namespace
{

std::shared_ptr<const Variable> ATarget(int numCategories)
{
    std::vector<std::string> categories;
    for (int i = 0; i < numCategories; ++i) categories.push_back(std::to_string(i));
    return AVariable("target", VariableKind::kStringCategorical, categories);
}

} // namespace

TEST(Measures, GainIsTheTargetEntropyLessTheModelEntropyUnlessRoundingLeftIt)
{
    AttributeBins bins = SomeBins(AVariable("x"), ATarget(2), {1}, {{6, 0}, {0, 6}});
    EXPECT_EQ(1.0, ComputeTargetEntropy(bins));
    EXPECT_EQ(std::nullopt, ComputeGain(bins)); // no model entropy is known

    bins.modelEntropy = 0.25;
    EXPECT_EQ(0.75, ComputeGain(bins));
    bins.modelEntropy = std::nextafter(1.0, 2.0);
    EXPECT_EQ(0.0, ComputeGain(bins));
    EXPECT_EQ(std::nullopt, ComputeTargetEntropy(SomeBins(AVariable("x"), nullptr, {}, {{5}})));
    EXPECT_EQ(std::nullopt, ComputeTargetEntropy(SomeBins(AVariable("x"), ATarget(2), {}, {})));
}

TEST(Measures, EvidenceIsOfTheSecondOfTwoCategories)
{
    AttributeBins bins = SomeBins(AVariable("x"), ATarget(2), {1, 2, 3}, {{6, 2}, {2, 4}, {0, 2}, {0, 0}});
    bins.smoothing = 0.0;

    const std::vector<Evidence> evidence = ComputeEvidence(bins);

    ASSERT_EQ(4U, evidence.size());
    EXPECT_EQ(0.25, evidence[0].rate);
    EXPECT_EQ(std::log(0.25 / 0.75), evidence[0].weightOfEvidence);
    EXPECT_EQ((0.25 - 0.75) * std::log(0.25 / 0.75), evidence[0].informationValue);
    EXPECT_EQ(std::numeric_limits<double>::infinity(), evidence[2].weightOfEvidence);
    // A bin without weight says nothing.
    EXPECT_EQ(0.0, evidence[3].rate);
    EXPECT_EQ(0.0, evidence[3].weightOfEvidence);
    EXPECT_EQ(0.0, evidence[3].informationValue);
    EXPECT_EQ(std::numeric_limits<double>::infinity(), ComputeInformationValue(bins));

    EXPECT_FALSE(IsSmoothed(bins));

    EXPECT_TRUE(ComputeEvidence(SomeBins(AVariable("x"), ATarget(3), {}, {{1, 1, 1}})).empty());
    EXPECT_TRUE(ComputeEvidence(SomeBins(AVariable("x"), ATarget(2), {1}, {{2, 0}, {1, 0}})).empty());
    EXPECT_EQ(std::nullopt, ComputeInformationValue(SomeBins(AVariable("x"), ATarget(2), {}, {})));
}

TEST(Measures, TheMissingAreAmongAllAndEmptyCellsAreSmoothed)
{
    AttributeBins bins = SomeBins(AVariable("x"), ATarget(2), {1}, {{6, 2}, {0, 4}});
    bins.missing = Bin{0.0, 0.0, 4.0, {2.0, 2.0}};

    const std::vector<Evidence> evidence = ComputeEvidence(bins);

    ASSERT_EQ(3U, evidence.size());
    EXPECT_EQ(std::log((2.0 / 8.0) / (6.0 / 8.0)), evidence[0].weightOfEvidence) << "no cell of it is empty";
    EXPECT_EQ(1.0, evidence[1].rate) << "a rate is not smoothed";
    EXPECT_EQ(std::log((4.5 / 8.0) / (0.5 / 8.0)), evidence[1].weightOfEvidence);
    EXPECT_EQ(0.0, evidence[2].weightOfEvidence);
    EXPECT_EQ(evidence[0].informationValue + evidence[1].informationValue, ComputeInformationValue(bins));
    EXPECT_TRUE(IsSmoothed(bins));

    const std::vector<BinRow> rows = MakeRows(bins);
    ASSERT_EQ(4U, rows.size());
    EXPECT_EQ("missing", rows[2].label);
    EXPECT_EQ(0.25, rows[2].share);
    EXPECT_EQ(BinRow::Kind::kTotal, rows[3].kind);
    EXPECT_EQ((std::vector<double>{8.0, 8.0}), rows[3].bin.weights);
    EXPECT_EQ(0.5, rows[3].evidence->rate);
    EXPECT_EQ(*ComputeInformationValue(bins), rows[3].evidence->informationValue);

    bins.missing->weight = 0.0;
    EXPECT_EQ(3U, MakeRows(bins).size()) << "what has no weight has no row";
    EXPECT_TRUE(MakeRows(SomeBins(AVariable("x"), nullptr, {}, {})).empty());
}

TEST(Measures, ResultsAreInTheOrderOfTheirGain)
{
    Bins bins;
    for (const double modelEntropy : {0.5, 0.25, 0.5})
    {
        bins.results.push_back(SomeBins(AVariable("x"), ATarget(2), {1}, {{6, 0}, {0, 6}}));
        bins.results.back().modelEntropy = modelEntropy;
    }
    bins.results.push_back(SomeBins(AVariable("uncut"), ATarget(2), {}, {{6, 6}}));

    const auto* const first = bins.results.data();
    EXPECT_EQ((std::vector<const AttributeBins*>{first + 1, first, first + 2}), SortByGain(bins));
}

TEST(Measures, EachOfSeveralCategoriesIsTheEventAgainstTheRest)
{
    AttributeBins bins = SomeBins(AVariable("x"), ATarget(4), {1}, {{6, 2, 0, 0}, {2, 4, 2, 0}});
    bins.missing = Bin{0.0, 0.0, 4.0, {0, 2, 2, 0}};

    const std::vector<Evidence> evidence = ComputeEvidence(bins, 1);
    ASSERT_EQ(3u, evidence.size());
    EXPECT_EQ(0.25, evidence[0].rate);
    EXPECT_EQ(std::log((2.0 / 8.0) / (6.0 / 12.0)), evidence[0].weightOfEvidence);
    EXPECT_EQ(0.0, evidence[1].weightOfEvidence - std::log((4.0 / 8.0) / (4.0 / 12.0)));
    EXPECT_TRUE(ComputeEvidence(bins).empty()) << "no category is the event unless it is named";
    EXPECT_TRUE(ComputeEvidence(bins, 3).empty()) << "it has no weight";
    EXPECT_TRUE(IsSmoothed(bins)); // the third category is not in the first bin

    const std::vector<BinRow> rows = MakeRows(bins);
    EXPECT_EQ(0.4, rows.back().evidenceByCategory[0]->rate);
    EXPECT_EQ(ComputeInformationValue(bins, 2), rows.back().evidenceByCategory[2]->informationValue);
    EXPECT_FALSE(rows.front().evidenceByCategory[3]);
}
