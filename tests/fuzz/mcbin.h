#ifndef MCOBNQRT_TESTS_FUZZ_MCBIN_H
#define MCOBNQRT_TESTS_FUZZ_MCBIN_H

#include "tests/fuzz/check.h"

#include <fstream>
#include <string>
#include <string_view>

/// Replaces what is in the file.
inline void WriteFile(const std::string& path, std::string_view text)
{
    std::ofstream file(path, std::ios::binary | std::ios::trunc);
    file.write(text.data(), static_cast<std::streamsize>(text.size()));
    file.close();
    Check(!file.fail(), "can't write a file");
}

#endif
