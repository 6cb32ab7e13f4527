#ifndef MCBIN_TABLEPROFILE_H
#define MCBIN_TABLEPROFILE_H

#include <exception>

class Progress;
class TableReader;
struct ColumnPlan;

/// Thrown by the record source if a column that was believed to hold numbers alone has a text.
struct NotOnlyNumbers : std::exception
{
};

enum class Care
{
    kHasty,   ///< a column whose first thousand fields are numbers is believed to hold nothing else
    kThorough ///< every field is looked at
};

/// Reads the table to its end, and so finds out what the columns of the plan hold: their kinds, where these aren't
/// given, their categories, the weights as a whole, and the number of rows. Memory doesn't grow with that number.
///
/// A column without a kind is continuous if every field is a number or missing, or if at least most are, where the
/// others are missing by the plan or else a failure. A column of text is categorical, or no attribute any more.
///
/// \throw Failure if a row is bad, if there is no row, if a column has more categories than the library takes, if a
///        field should be a number and isn't, if a weight is negative or infinite, or if an attribute was asked for by
///        name and is text.
void ProfileTable(TableReader& table, ColumnPlan& plan, Progress& progress, Care care);

/// Reads the table once more for the scale of its weights, if they are to be scaled.
void ScaleWeights(TableReader& table, ColumnPlan& plan, Progress& progress);

#endif
