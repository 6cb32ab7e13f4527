#include "hosts/mcbin/input/columnplan.h"
#include "hosts/mcbin/input/recordsource.h"
#include "hosts/mcbin/input/tableprofile.h"
#include "hosts/mcbin/input/tablereader.h"
#include "hosts/mcbin/input/variables.h"
#include "hosts/mcbin/options.h"
#include "hosts/mcbin/progress.h"

#include <chrono>
#include <cstdio>
#include <exception>

// Times what mcbin does outside of the library: the pass that learns the columns, and the one that makes the records,
// which are dropped here. Prints the seconds of both.

namespace
{

double GetSeconds(std::chrono::steady_clock::time_point begin)
{
    return std::chrono::duration<double>(std::chrono::steady_clock::now() - begin).count();
}

void Time(const char* file, const char* target)
{
    TableOptions tableOptions;
    tableOptions.file = file;
    tableOptions.isReadTwice = true;
    ColumnOptions columns;
    columns.target = target;
    Progress progress(false);

    const auto begin = std::chrono::steady_clock::now();
    TableReader table(tableOptions);
    ColumnPlan plan = PlanColumns(table, columns);
    ProfileTable(table, plan, progress, Care::kHasty);
    Variables variables = MakeVariables(plan);
    const double profile = GetSeconds(begin);
    TableRecordSource source(table, plan, variables, progress);
    while (source.HasNext()) source.Next();
    std::printf("%.3f %.3f\n", profile, GetSeconds(begin) - profile);
}

} // namespace

int main(int argc, char** argv)
{
    if (argc != 3)
    {
        std::fputs("usage: mcbininput FILE TARGET\n", stderr);
        return 2;
    }
    try
    {
        Time(argv[1], argv[2]);
        return 0;
    }
    catch (const std::exception& error)
    {
        std::fprintf(stderr, "mcbininput: %s\n", error.what());
        return 1;
    }
}
