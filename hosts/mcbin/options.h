#ifndef MCBIN_OPTIONS_H
#define MCBIN_OPTIONS_H

#include "bins/bins.h"
#include "bins/sql.h"
#include "hosts/mcbin/input/tablereader.h"

#include <string>
#include <vector>

// What a user can ask for. main() fills these from the command line.

/// Which columns take part, and how their fields are read. A name may be a pattern, with * and ? and [], and an element
/// of a list of names may be several with commas between them.
struct ColumnOptions
{
    std::string target; ///< a name, not a pattern; empty without one
    std::string weight; ///< a name, not a pattern; empty without one
    WeightRounding rounding = WeightRounding::kNone;
    bool isWeightScaled = false;         ///< to sum to the number of rows with a weight
    std::vector<std::string> attributes; ///< empty: all columns of numbers
    std::vector<std::string> exclude;
    std::vector<std::string> categorical;
    std::vector<std::string> continuous;
    std::vector<std::string> pairs; ///< each ATTRIBUTE:TARGET, where the attribute may be a pattern
    std::vector<std::string> missingText;
    std::vector<std::string> missing;       ///< each COLUMN=9,99,unknown,90:99
    std::vector<std::string> categoryOrder; ///< each rate, text, or COLUMN=a,b,c
    double rareShare = 0.0;                 ///< categories of less than this share of the weight have a code together
    bool areTextsBinned = false;            ///< there is a target: columns of text are binned though they are not named
    bool isBadMissing = false;              ///< what is no number, where it should be one, is missing and no failure
};

enum class Format
{
    kTable,
    kHtml,
    kJson,
    kCsv,
    kSql
};

struct OutputOptions
{
    Format format = Format::kTable;
    std::string report; ///< the file for the page; empty for none
    SqlOptions sql;
    bool areCategoriesShown = false; ///< in tables
    bool isStrict = false;           ///< the exit code tells of a warning
    bool isQuiet = false;            ///< no progress line, even on a terminal
};

struct BinOptions
{
    TableOptions table;
    ColumnOptions columns;
    Settings settings;
    bool areCutsRounded = false; ///< to the shortest decimals between the values
    std::string tempDirectory;   ///< empty for the library's default
    OutputOptions output;
};

struct ShowOptions
{
    std::string bins; ///< the file that was written as JSON
    OutputOptions output;
};

struct EvaluateOptions
{
    std::string bins;              ///< the file that was written as JSON; empty if `cuts` make the bins
    std::vector<std::string> cuts; ///< each COLUMN=18,25,40
    TableOptions table;
    ColumnOptions columns; ///< of which the target, the weight and what is missing matter
    Settings settings;     ///< of bins that are made from cut points
    std::string tempDirectory;
    std::string save; ///< the file for the bins as they were counted; empty for none
    OutputOptions output;
};

struct ApplyOptions
{
    std::string bins; ///< the file that was written as JSON
    TableOptions table;
    std::string output; ///< "-" for standard output
    std::vector<std::string> missingText;
    bool isBadMissing = false;
    Encoding encoding = Encoding::kNumber;
    bool isInPlace = false; ///< replaces the columns
    bool isQuiet = false;
};

#endif
