#include "hosts/mcbin/output/tableoutput.h"

#include "bins/numbers.h"
#include "bins/utf8.h"
#include "bins/words.h"
#include "hosts/mcbin/figures.h"
#include "hosts/mcbin/findings.h"
#include "hosts/mcbin/output/bintable.h"
#include "hosts/mcbin/text.h"

#include <fmt/format.h>

#include <algorithm>
#include <ostream>
#include <string>
#include <vector>

namespace
{

std::string GetHeading(const Findings& findings, const Result& result)
{
    const Variable* const target = findings.FindTarget(result);
    const std::string name = Printable(findings.GetAttribute(result).name);
    return target ? name + " by " + Printable(target->name) : name;
}

void PrintHeading(std::ostream& os, const Findings& findings, const Result& result, const Screen& screen)
{
    const std::string heading = GetHeading(findings, result);
    os << (screen.hasColours ? "\x1b[1m" + heading + "\x1b[0m" : heading);
    if (result.targetEntropy && result.modelEntropy)
        os << fmt::format(": gain {:.4f} bits, {:.1f}%", GetGain(result),
                          100.0 * GetShare(GetGain(result), *result.targetEntropy));
    os << '\n';
    if (result.targetEntropy && result.modelEntropy)
        os << "  entropy " << FormatNumber(*result.targetEntropy) << " before, " << FormatNumber(*result.modelEntropy)
           << " after\n";
    os << "  " << DescribeValues(findings, result) << ", missing weight "
       << FormatWeight(result.weightWithMissing - result.weight) << '\n';
}

/// With an error or a warning about an attribute that has cut points all the same.
void PrintStatus(std::ostream& os, const Result& result)
{
    if (!result.status.IsOK())
        os << "  " << DescribeStatus(result.status) << '\n';
}

void PrintUncut(std::ostream& os, const Findings& findings)
{
    const std::vector<const Result*> uncut = GetUncut(findings);
    if (uncut.empty())
        return;
    std::size_t width = 0;
    for (const Result* const result : uncut) width = std::max(width, GetWidth(GetHeading(findings, *result)));
    os << "Without cut points:\n";
    for (const Result* const result : uncut)
        os << "  " << PadRight(GetHeading(findings, *result), width) << "  " << DescribeStatus(result->status) << '\n';
    os << '\n';
}

} // namespace

void PrintTables(std::ostream& os, const Findings& findings, const Screen& screen)
{
    for (const Result* const result : SortByGain(findings))
    {
        PrintHeading(os, findings, *result, screen);
        PrintBinTable(os, findings, *result, screen);
        PrintStatus(os, *result);
        os << '\n';
    }
    PrintUncut(os, findings);
    if (const std::string words = DescribeWithoutWeight(findings); !words.empty())
        os << "Left out, as they have no weight: " << words << '\n';
    if (!findings.leftOut.empty())
        os << "Left out, as they hold text: " << Join(findings.leftOut, ", ") << '\n';
}
