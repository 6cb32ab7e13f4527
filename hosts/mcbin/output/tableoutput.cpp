#include "hosts/mcbin/output/tableoutput.h"

#include "bins/labels.h"
#include "bins/measures.h"
#include "bins/numbers.h"
#include "bins/rows.h"
#include "bins/utf8.h"
#include "bins/words.h"
#include "hosts/mcbin/outcome.h"
#include "hosts/mcbin/output/bintable.h"
#include "hosts/mcbin/output/describe.h"
#include "hosts/mcbin/text.h"

#include <fmt/format.h>

#include <algorithm>
#include <ostream>
#include <string>
#include <vector>

namespace
{

void PrintHeading(std::ostream& os, const AttributeBins& bins, const Screen& screen)
{
    const std::string heading = MakeHeading(bins);
    os << (screen.hasColours ? "\x1b[1m" + heading + "\x1b[0m" : heading);
    const std::optional<double> entropy = ComputeTargetEntropy(bins);
    const std::optional<double> gain = ComputeGain(bins);
    if (gain)
        os << fmt::format(": gain {:.4f} bits, {:.1f}%", *gain, 100.0 * ComputeShare(*gain, *entropy));
    os << '\n';
    if (gain)
        os << fmt::format("  entropy {:.4f} before, {:.4f} after\n", *entropy, *bins.modelEntropy);
    os << "  " << DescribeValues(bins) << ", missing weight " << FormatWeight(bins.weightWithMissing - bins.weight)
       << '\n';
}

/// With an error or a warning about an attribute that has cut points all the same.
void PrintStatus(std::ostream& os, const AttributeBins& bins)
{
    if (!bins.status.IsOK())
        os << "  " << DescribeStatus(bins.status) << '\n';
}

void PrintUncut(std::ostream& os, const Bins& bins)
{
    const std::vector<const AttributeBins*> uncut = FindUncut(bins);
    if (uncut.empty())
        return;
    std::size_t width = 0;
    for (const AttributeBins* const result : uncut) width = std::max(width, GetWidth(MakeHeading(*result)));
    os << "Without cut points:\n";
    for (const AttributeBins* const result : uncut)
        os << "  " << PadRight(MakeHeading(*result), width) << "  " << DescribeStatus(result->status) << '\n';
    os << '\n';
}

} // namespace

void PrintTables(std::ostream& os, const Outcome& outcome, const Screen& screen)
{
    for (const AttributeBins* const result : SortByGain(outcome.bins))
    {
        PrintHeading(os, *result, screen);
        PrintBinTable(os, *result, screen);
        if (outcome.areCategoriesShown && !result->categories.empty())
        {
            os << "  each category\n";
            PrintBinTable(os, SplitByCategory(*result), screen);
        }
        PrintStatus(os, *result);
        os << '\n';
    }
    PrintUncut(os, outcome.bins);
    if (const std::string words = DescribeWithoutWeight(outcome.bins); !words.empty())
        os << "Left out, as they have no weight: " << words << '\n';
    if (!outcome.leftOut.empty())
        os << "Left out: " << Join(outcome.leftOut, ", ") << '\n';
}
