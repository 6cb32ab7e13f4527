#include "hosts/mcbin/progress.h"

#include "bins/utf8.h"
#include "hosts/mcbin/interrupt.h"
#include "hosts/mcbin/terminal.h"
#include "hosts/mcbin/text.h"

#include <mcobnqrt/progressreport.h>

#include <fmt/format.h>

#include <algorithm>
#include <cstdio>
#include <string_view>

#include <unistd.h>

namespace
{

/// Rows between two looks at the clock. At some million rows a second this is several times a second.
constexpr long kRowsBetween = 1 << 16;

} // namespace

void Progress::BeginRows(const std::string& what)
{
    fWhat = what;
    fRows = 0;
    fBegin = std::chrono::steady_clock::now();
}

void Progress::CountRow()
{
    if (++fRows % kRowsBetween != 0)
        return;
    ThrowIfInterrupted();
    ShowRows(fRows);
}

void Progress::BeginAttributes()
{
    fAreAttributes = true;
    if (fNumAttributes > 0)
        Show(fmt::format("binning {} of {}", 1, fNumAttributes));
}

void Progress::ReportProgress(ProgressReport& report)
{
    const int index = report.DiscreteMeasure("IndexVar");
    if (!fAreAttributes)
    {
        ShowRows(index);
        return;
    }
    fAttributesDone = std::min(fAttributesDone + 1, fNumAttributes);
    const bool isKnown = index >= 0 && static_cast<std::size_t>(index) < fNames.size();
    Show(fmt::format("binned {} of {}: {}", fAttributesDone, fNumAttributes,
                     isKnown ? Printable(fNames[static_cast<std::size_t>(index)]) : "?"));
}

void Progress::Erase()
{
    if (fIsOnScreen)
        std::fputs("\r\x1b[K", stderr);
    fIsOnScreen = false;
}

void Progress::ShowRows(long rows)
{
    const std::chrono::duration<double> elapsed = std::chrono::steady_clock::now() - fBegin;
    Show(fmt::format("{}: {} rows, {:.0f} rows/s", fWhat, rows,
                     static_cast<double>(rows) / std::max(elapsed.count(), 1e-3)));
}

void Progress::Show(const std::string& text)
{
    if (!fIsShown)
        return;
    const std::string_view line = Clip(text, GetTerminalWidth(STDERR_FILENO).value_or(80) - 1);
    std::fputs(("\r\x1b[K" + std::string(line)).c_str(), stderr);
    std::fflush(stderr);
    fIsOnScreen = true;
}
