#ifndef MCOBNQRT_BINS_TEMPDIRECTORY_H
#define MCOBNQRT_BINS_TEMPDIRECTORY_H

#include <stdexcept>
#include <string>

/// TMPDIR of the environment names no directory that files can be made in; what() says so to the user, and what to do.
class TempDirectoryUnusable : public std::runtime_error
{
public:
    using std::runtime_error::runtime_error;
};

/// Where temporary files go: `named` if the user has named a directory, else the library's default.
///
/// Where TMPDIR is set and can't be used the default is another directory, in which a user would not look for the
/// records. So that is refused, with `option` in the text as the way to name a directory.
///
/// \throw TempDirectoryUnusable
std::string ChooseTempDirectory(const std::string& named, const std::string& option);

#endif
