#ifndef MCBIN_FIGURES_H
#define MCBIN_FIGURES_H

#include <cstddef>
#include <string>
#include <vector>

struct Bin;
struct Findings;
struct Result;

// What follows from the weights of the bins.

/// Of a distribution with these weights, in bits; 0 if there is no weight.
double GetEntropy(const std::vector<double>& weights);

/// The weight of each category of the target over all bins.
std::vector<double> GetCategoryWeights(const Result& result);

/// Whether the result has a target of two categories, the second of which is the event of the rates.
bool HasTwoCategories(const Findings& findings, const Result& result);

/// Of categories with these weights: the codes of the heaviest `number`, in ascending order.
std::vector<std::size_t> GetHeaviest(const std::vector<double>& weights, std::size_t number);

/// By how many bits the bins lower the entropy of the target; 0 where that wasn't worked out.
double GetGain(const Result& result);

/// `part` of `whole`; 0 if the whole is.
double GetShare(double part, double whole);

/// Of a bin, for a target of two categories of which the second is the event: the logarithm of the share of all events
/// that the bin has over its share of all non-events. Infinite where the bin has none of one.
double GetWeightOfEvidence(const Bin& bin, const std::vector<double>& categoryWeights);

/// The difference of these shares times the weight of evidence. Summed over the bins it is the attribute's value.
double GetInformationValue(const Bin& bin, const std::vector<double>& categoryWeights);
double GetInformationValue(const Result& result);

/// Results with cut points, those of greater gain first; of equal gain, and without a target, as they were found.
std::vector<const Result*> SortByGain(const Findings& findings);

/// Results without cut points, as they were found.
std::vector<const Result*> GetUncut(const Findings& findings);

/// "(1.5, 4]", with the bracket at the end that is closed; "(-inf, 1.5]" and "(4, +inf)" at the outside, which hold the
/// infinities. An infinity that is a cut point has a bin for itself: "[-inf, -inf]" with the right end closed, and
/// "[+inf, +inf]" with the left one.
std::string FormatInterval(const Findings& findings, const Bin& bin);

/// What values the attribute has, as in "22 distinct values from 0.1 to 2.5", or "3 categories from 'high' to 'low'".
std::string DescribeValues(const Findings& findings, const Result& result);

/// How many records were left out, as in "3 records"; empty if none was.
std::string DescribeWithoutWeight(const Findings& findings);

/// The categories of a categorical attribute that are in the bin, which must be one of the result's; of another
/// attribute none.
std::vector<std::string> GetBinCategories(const Findings& findings, const Result& result, const Bin& bin);

/// The interval, or for a categorical attribute its categories in the bin, as in "{a, b}".
std::string FormatBin(const Findings& findings, const Result& result, const Bin& bin);

/// The name of the column that holds the attribute's bins in new data: "age_bin", or, where the attribute has been
/// binned for more than one target, "age_by_bought_bin".
std::string GetBinColumn(const Findings& findings, const Result& result);

/// The bin of the value, from 0. What lies outside of the range seen belongs to an outer bin.
std::size_t FindBin(const std::vector<double>& cutPoints, bool isRightClosed, double value);

#endif
