#ifndef MCBIN_COLUMNPLAN_H
#define MCBIN_COLUMNPLAN_H

#include "bins/bins.h"
#include "bins/numberform.h"
#include "bins/weightgrid.h"

#include <cstddef>
#include <optional>
#include <set>
#include <string>
#include <string_view>
#include <utility>
#include <vector>

class TableReader;
struct ColumnOptions;

enum class ColumnKind
{
    kUnknown, ///< to be found out from the fields
    kContinuous,
    kCategorical
};

/// A column of the table: its part in the analysis, and what is found out about it.
struct Column
{
    std::string name;
    ColumnKind kind = ColumnKind::kUnknown;
    bool isAttribute = false;
    bool isTarget = false;
    bool isWeight = false;
    bool isNamed = false; ///< asked for by its own name, so it can't be left out silently

    std::vector<std::string> missingTexts; ///< declared for this column, as they are written
    std::vector<double> missingNumbers;    ///< those of them, and of the texts of all columns, that are numbers
    std::optional<std::pair<double, double>> missingInterval;

    bool isBelieved = false; ///< its first rows hold numbers alone, so the first pass leaves the others to the second
    long numNumbers = 0;     ///< fields that are numbers, of those looked at
    long numTexts = 0;       ///< fields that are something else
    long numOrnamented = 0;  ///< texts that are numbers with signs such as $ around or in them
    std::string firstOrnamented;                   ///< the first text with such signs
    std::string firstText;                         ///< the first of numTexts, or the category that is one too many
    long firstTextLine = 0;                        ///< line of firstText
    std::set<std::string, std::less<>> categories; ///< the different fields, if it may be categorical
    bool isBinary = false;                         ///< a field is not UTF-8, so it can't be a category

    /// The categories by code, where they don't ascend: as declared, or as they are ordered by a target.
    std::vector<std::string> order;
    std::string orderTarget;       ///< the name of that target; empty without one
    std::string rareName;          ///< the name of the code that rare categories share; empty without one
    std::vector<std::string> rare; ///< these categories
    std::string reasonLeftOut;     ///< why a column of text is no attribute

    bool IsUsed() const { return isAttribute || isTarget || isWeight; }

    /// Whether it holds text, as at least half of its fields do, and wasn't said to hold anything else.
    bool IsText() const { return kind == ColumnKind::kUnknown && numTexts > 0 && numTexts >= numNumbers; }

    /// Whether its texts are numbers for the most part, written with signs that this tool doesn't read.
    bool IsOrnamented() const { return numOrnamented > numTexts / 2; }

    /// Whether the number is declared missing.
    bool IsMissing(double number) const;
};

/// All columns of a table, in their order, with their parts in the analysis.
struct ColumnPlan
{
    std::vector<Column> columns;
    std::vector<std::pair<std::size_t, std::size_t>> pairs; ///< attribute and target; empty without a list of pairs
    std::vector<std::string> missingTexts;                  ///< of all columns, beside the empty one
    bool areTextsBinned = false; ///< columns of text are attributes though they are not named, if they can be
    double rareShare = 0.0;      ///< categories of less than this share of the weight have a code together
    bool isByRate = false;       ///< categories that have no order are ordered by the rate of the target
    NumberForm numbers;          ///< how they are written
    bool isBadMissing = false;
    long numRows = 0;
    WeightTally weights; ///< of all rows, if a column holds weights
    bool isWeightScaled = false;
    long numWithoutWeight = 0; ///< rows whose weight is missing

    /// Whether the field stands for a missing value as text, before it is looked at as a number.
    bool IsMissing(const Column& column, std::string_view field) const
    {
        if (field.empty())
            return true;
        return (!missingTexts.empty() && IsIn(missingTexts, field)) ||
               (!column.missingTexts.empty() && IsIn(column.missingTexts, field));
    }

    /// Whether the number can be a weight, or is missing or bad.
    static bool IsWeight(const Column& column, double number);

    /// Columns of text that could have been attributes, each with the reason and an example of what it holds.
    std::vector<std::string> DescribeLeftOut() const;

    static bool IsIn(const std::vector<std::string>& texts, std::string_view field);
};

/// Gives the columns of the table their parts.
/// \throw Failure if a name or pattern fits no column, parts contradict each other, or the name of a column that has a
///        part, or a text for missing values, is not UTF-8.
ColumnPlan PlanColumns(const TableReader& table, const ColumnOptions& options);

#endif
