#ifndef MCOBNQRT_RESULTPARTS_H
#define MCOBNQRT_RESULTPARTS_H

#include "base/makestatus.h"

#include <mcobnqrt/mcstatus.h>

#include <ostream>
#include <utility>
#include <vector>

/// What the results of both kinds of run, and the stores that hold them, have in common. `Results` is
/// BINAttributeTargetResults or BINAttributeResults, whose displays differ only in the lines that one of them
/// lacks.

/// Replaces `results` by a copy of the entries of a store.
template<class Results>
MCBinning::MCStatus CopyAllEntries(const std::vector<Results>& entries, std::vector<Results>& results)
{
    if (entries.empty())
        return MakeError(MCBinning::BINStatusNoResults);
    results = std::vector<Results>(entries); // by way of a copy: a failing allocation leaves `results` whole
    return MCBinning::MCStatus();
}

/// Replaces `results` by a copy of an entry. Gives the entry's own status.
template<class Results>
MCBinning::MCStatus CopyEntry(const Results& entry, Results& results)
{
    results = Results(entry); // by way of a copy: a failing allocation leaves `results` whole
    return results.GetStatus();
}

/// Writes the lines up to the attribute.
template<class Results>
void DisplayHead(std::ostream& os, const char* className, const Results& results)
{
    os << std::endl;
    os << "Start of " << className << " display" << std::endl;
    os << "BINDataTuple   attribute = " << results.GetAttributeIndex() << std::endl;
}

/// Writes the lines from the number of distinct values to the maximum.
template<class Results>
void DisplayFigures(std::ostream& os, const Results& results)
{
    os << "Number of distinct values = " << results.GetNDistinctValues() << std::endl;
    os << "Total weight = " << results.GetTotalWeight() << std::endl;
    os << "Total weight with missing = " << results.GetTotalWeightWithMissing() << std::endl;
    os << "Minimum = " << results.GetMinimum() << std::endl;
    os << "Maximum = " << results.GetMaximum() << std::endl;
}

/// Writes the lines from the status to the heading of the counts.
template<class Results>
void DisplayCutPoints(std::ostream& os, const Results& results)
{
    if (!results.GetStatus().IsOK())
        os << "Status has error code " << results.GetStatus().GetErrorCode() << std::endl;
    os << "Number of cutpoints = " << results.GetCutPoints().size();
    if (!results.GetCutPoints().empty())
        os << ", the cutpoints:";
    os << std::endl;
    for (double cutPoint : results.GetCutPoints()) os << cutPoint << std::endl;
    os << "The CellCounts are" << std::endl;
}

/// Writes one line of counts.
inline void DisplayCounts(std::ostream& os, const std::vector<double>& counts)
{
    for (double count : counts) os << count << "  ";
    os << std::endl;
}

/// Writes the whole display of a store.
template<class Results>
void DisplayEntries(std::ostream& os, const char* className, const std::vector<Results>& entries)
{
    os << std::endl;
    os << "Start of " << className << " display" << std::endl;
    os << "cut point :"; // the first line end of an entry's display ends this line too
    for (const Results& entry : entries) entry.Display(os);
    os << std::endl;
    os << "End of " << className << " display" << std::endl;
}

#endif
