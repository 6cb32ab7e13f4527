#ifndef MCBIN_DESCRIBE_H
#define MCBIN_DESCRIBE_H

#include "bins/rows.h"

#include <cstddef>
#include <string>
#include <vector>

struct Evaluation;

// What the tables for people and the page have in common.

/// The codes of the `number` heaviest of categories with these weights, ascending.
std::vector<std::size_t> FindHeaviest(const std::vector<double>& weights, std::size_t number);

/// What a heading calls the attribute.
std::string MakeHeading(const AttributeBins& bins);

/// Results without cut points, as they were found.
std::vector<const AttributeBins*> FindUncut(const Bins& bins);

/// What values the attribute has, as in "22 distinct values from 0.1 to 2.5", or "3 categories from 'high' to 'low'".
std::string DescribeValues(const AttributeBins& bins);

/// Which records of the second population do not fit the bins; empty if all do.
std::vector<std::string> DescribeStrangers(const Evaluation& evaluation, std::size_t index);

/// How many records were left out, as in "3 records"; empty if none was.
std::string DescribeWithoutWeight(const Bins& bins);

/// Of which category the rate and the weight of evidence are, and the information value; empty where there is none.
std::string DescribeEvidence(const AttributeBins& bins);

/// How the weights of evidence are smoothed; empty if none had to be.
std::string DescribeSmoothing(const AttributeBins& bins);

/// Of a row with this evidence; empty of the total, which has no weight of evidence.
std::string FormatWeightOfEvidence(const BinRow& row, const Evidence& evidence);

/// The categories that a bin of a categorical attribute holds; of another attribute none.
std::vector<std::string> ListCategories(const AttributeBins& bins, std::size_t bin);

#endif
