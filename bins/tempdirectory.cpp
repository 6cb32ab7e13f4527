#include "bins/tempdirectory.h"

#include <mcobnqrt/binsettings.h>

#include <cstdlib>

namespace
{

/// In the form of the library's default.
std::string WithoutTrailingSeparators(std::string directory)
{
    while (directory.size() > 1 && directory.back() == '/') directory.pop_back();
    return directory;
}

} // namespace

std::string ChooseTempDirectory(const std::string& named, const std::string& option)
{
    if (!named.empty())
        return named;
    std::string standard = BINSettings().GetTempDirName(); // TMPDIR, if the library can use it
    const char* const fromEnvironment = std::getenv("TMPDIR");
    const std::string wanted = WithoutTrailingSeparators(fromEnvironment != nullptr ? fromEnvironment : "");
    if (!wanted.empty() && wanted != standard)
    {
        throw TempDirectoryUnusable("TMPDIR is " + wanted +
                                    ", which is no directory that files can be made in; set it to one, unset it, or "
                                    "give " +
                                    option);
    }
    return standard;
}
