#ifndef MCOBNQRT_TESTS_FUZZ_CHECK_H
#define MCOBNQRT_TESTS_FUZZ_CHECK_H

#include <cstdio>
#include <cstdlib>
#include <string>

/// Ends the process, which the fuzzer takes for a finding.
[[noreturn]] inline void Fail(const std::string& words)
{
    std::fprintf(stderr, "fuzz target: %s\n", words.c_str());
    std::abort();
}

/// Fails unless `holds`. Words that have to be put together are for Fail(), as this is called for each value.
inline void Check(bool holds, const char* words)
{
    if (!holds)
        Fail(words);
}

#endif
