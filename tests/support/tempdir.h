#ifndef MCOBNQRT_TESTS_TEMPDIR_H
#define MCOBNQRT_TESTS_TEMPDIR_H

#include <filesystem>
#include <string>
#include <vector>

#include <stdlib.h>

/// A directory of the test's own, gone with all that is in it when the object goes.
class TempDir
{
public:
    TempDir()
    {
        std::string pattern = (std::filesystem::temp_directory_path() / "mcobnqrt-test-XXXXXX").string();
        fPath = mkdtemp(pattern.data());
    }
    TempDir(const TempDir&) = delete;
    TempDir& operator=(const TempDir&) = delete;
    ~TempDir()
    {
        std::error_code ignored; // nothing that a test could do about it
        std::filesystem::remove_all(fPath, ignored);
    }

    const std::string& Path() const { return fPath; }
    std::string File(const std::string& name) const { return fPath + "/" + name; }

    std::vector<std::string> FileNames() const
    {
        std::vector<std::string> names;
        for (const auto& entry : std::filesystem::directory_iterator(fPath)) names.push_back(entry.path().filename());
        return names;
    }

    bool IsEmpty() const { return FileNames().empty(); }

private:
    std::string fPath;
};

#endif
