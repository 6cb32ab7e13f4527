#include "bench/workloads.h"
#include "tests/support/tempdir.h"

#include <cstdio>
#include <cstdlib>
#include <stdexcept>

/// wholerun WORKLOAD SCALE: one run, in a directory of its own. Fails if it finds nothing.
int main(int argc, char** argv)
try
{
    if (argc != 3 || std::atoi(argv[2]) < 1)
        throw std::runtime_error("wants WORKLOAD SCALE");
    const TempDir directory;
    return RunWhole(MakeWorkload(argv[1], static_cast<std::size_t>(std::atoi(argv[2]))), directory.Path()) > 0 ? 0 : 1;
}
catch (const std::exception& failure)
{
    std::fprintf(stderr, "wholerun: %s\n", failure.what());
    return 1;
}
