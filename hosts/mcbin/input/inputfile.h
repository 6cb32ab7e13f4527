#ifndef MCBIN_INPUTFILE_H
#define MCBIN_INPUTFILE_H

#include <cstddef>
#include <cstdio>
#include <memory>
#include <string>

/// A file that is read from its beginning to its end. All operations throw a Failure that names it where the system
/// refuses, and Interrupted where a signal ends the wait for it.
class InputFile
{
public:
    /// Opens the file. "-" stands for standard input.
    explicit InputFile(const std::string& path);

    /// Makes sure that it can be rewound: what is no regular file, such as a pipe, is copied to a file in `directory`
    /// that no other process can open and that has no name, so that it can't stay behind. An empty `directory` stands
    /// for the library's default. Only to be called before anything is read.
    void MakeRewindable(const std::string& directory);

    /// Fills `buffer` unless the file ends before, and gives the number of bytes. \throw Interrupted if the file ends
    /// after a signal that asks for the end: the signal may be what has cut it short.
    std::size_t Read(char* buffer, std::size_t size);

    /// Only to be called after MakeRewindable().
    void Rewind();

    const std::string& GetName() const { return fName; }

private:
    struct Closer
    {
        void operator()(std::FILE* file) const { std::fclose(file); }
    };

    void CopyTo(std::FILE* spool);

    std::string fName;
    std::unique_ptr<std::FILE, Closer> fFile;
};

#endif
