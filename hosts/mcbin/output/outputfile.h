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

/// A file that is written as a whole or not at all: until Commit() it has another name in the same directory and is
/// its owner's alone, and it is removed if it doesn't come to that. A link stays one, and the file that it leads to is
/// replaced. What isn't a regular file is written as it stands: a device, a pipe, and a descriptor of the process such
/// as /dev/stdout, whatever that leads to. All operations throw a Failure if the system refuses, also for a file that
/// may not be written.
class OutputFile
{
public:
    /// "-" stands for standard output.
    explicit OutputFile(const std::string& path);
    OutputFile(const OutputFile&) = delete;
    OutputFile& operator=(const OutputFile&) = delete;
    ~OutputFile();

    void Write(std::string_view text);

    /// Everything has been written: flushes the file to the disk and gives it its name, in place of one that has it.
    /// It takes over the mode of the latter, with owner and group where the system allows; a new one gets what the
    /// umask leaves. \throw Interrupted, and nothing is replaced, after a signal that asks for the end.
    void Commit();

private:
    struct Closer
    {
        void operator()(std::FILE* file) const;
    };

    void OpenTemporary(const std::string& target);
    void Secure(int descriptor) const;
    [[noreturn]] void Fail() const;

    std::string fPath;      ///< as it was asked for, for messages
    std::string fTarget;    ///< what the links lead to; empty if no file is replaced
    std::string fTemporary; ///< the name for the time being; empty if there is no need of one
    std::unique_ptr<std::FILE, Closer> fFile;
};

#endif
