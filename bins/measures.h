#ifndef MCOBNQRT_BINS_MEASURES_H
#define MCOBNQRT_BINS_MEASURES_H

#include "bins/bins.h"

#include <optional>
#include <vector>

// What follows from the weights of the bins.

/// Of a distribution with these weights, in bits, summed in their order; 0 if there is no weight.
double ComputeEntropy(const std::vector<double>& weights);

/// The weight of each category of the target over all bins, summed from the first bin on; empty without a target.
std::vector<double> SumByCategory(const AttributeBins& bins);

/// The entropy of the target over all bins, in bits. Nothing without a target or bins.
std::optional<double> ComputeTargetEntropy(const AttributeBins& bins);

/// By how many bits the bins lower the entropy of the target. Nothing where one of the two was not found.
std::optional<double> ComputeGain(const AttributeBins& bins);

/// `part` of `whole`; 0 if the whole is.
double ComputeShare(double part, double whole);

/// What is left of the target's entropy within the bins, in bits, by the library's own additions: the bins of a run have
/// the model entropy that the run has told, to the last bit. Nothing without a target, bins, or weight.
std::optional<double> ComputeModelEntropy(const AttributeBins& bins);

/// What a bin, or the records without a value, say about one category of the target, the event, against all others.
struct Evidence
{
    /// The share of the weight that has the event.
    double rate;
    /// The weight of evidence ln(p / q): p is the share of all events, and q that of all others; events and others with
    /// a missing value are among all. Where a bin has no events or no others, the smoothing is added to both of its
    /// weights; without smoothing the weight of evidence is infinite then. It is 0 where the bin has neither.
    double weightOfEvidence;
    /// (p - q) ln(p / q). The sum over all of them is the information value of the attribute.
    double informationValue;
};

/// The category that is the event where none is named: the second of two; nothing of another target.
std::optional<std::size_t> FindEvent(const AttributeBins& bins);

/// By bin, and one more behind them where records without a value have weight. Empty unless both the event, which is a
/// code of the target, and the others have weight.
std::vector<Evidence> ComputeEvidence(const AttributeBins& bins, std::size_t event);

/// That of the event where none is named; empty without one.
std::vector<Evidence> ComputeEvidence(const AttributeBins& bins);

/// Whether the smoothing has changed some of the evidence.
bool IsSmoothed(const AttributeBins& bins);

/// Whether there are records without a value, and they have weight.
bool HasMissing(const AttributeBins& bins);

/// Nothing where ComputeEvidence() is empty.
std::optional<double> ComputeInformationValue(const AttributeBins& bins, std::size_t event);
std::optional<double> ComputeInformationValue(const AttributeBins& bins);

/// Results with the largest gain first, those of equal gain, or without one, in their order. Only those with cut
/// points.
std::vector<const AttributeBins*> SortByGain(const Bins& bins);

#endif
