#ifndef MCBIN_OUTPUTFILE_H
#define MCBIN_OUTPUTFILE_H

#include <cstdio>
#include <memory>
#include <string>
#include <string_view>

/// Thrown where standard output is a pipe whose reader has gone, as with "| head": there is no one to tell anything.
struct PipeClosed
{
};

/// A file that is written as a whole or not at all: until Commit() it has another name in the same directory, and is
/// removed if it doesn't come to that. What isn't a regular file, such as a device or standard output, is written as it
/// stands. All operations throw a Failure if the system refuses.
class OutputFile
{
public:
    /// "-" stands for standard output.
    explicit OutputFile(const std::string& path);
    OutputFile(const OutputFile&) = delete;
    OutputFile& operator=(const OutputFile&) = delete;
    ~OutputFile();

    void Write(std::string_view text);

    /// Everything has been written: gives the file its name, in place of one that has it.
    void Commit();

private:
    struct Closer
    {
        void operator()(std::FILE* file) const;
    };

    void OpenTemporary();
    [[noreturn]] void Fail() const;

    std::string fPath;
    std::string fTemporary; ///< the name for the time being; empty if there is no need of one
    std::unique_ptr<std::FILE, Closer> fFile;
};

#endif
