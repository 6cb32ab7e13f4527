#ifndef MCBIN_INPUTFILE_H
#define MCBIN_INPUTFILE_H

#include "hosts/mcbin/input/decompressor.h"

#include <cstddef>
#include <cstdio>
#include <memory>
#include <string>
#include <vector>

/// A file that is read from its beginning to its end. One that is compressed, which its first bytes tell, is read as what
/// it stands for. All operations throw a Failure that names it where the system
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
    std::size_t ReadFile(char* buffer, std::size_t size);
    void LookAtBeginning();
    std::size_t ReadTaken(char* buffer, std::size_t size);
    std::size_t Decompress(char* buffer, std::size_t size);

    std::string fName;
    std::unique_ptr<std::FILE, Closer> fFile;
    bool fIsLookedAt = false;                    ///< it is known whether the file is compressed
    std::unique_ptr<Decompressor> fDecompressor; ///< null if it isn't
    std::vector<char> fInput;                    ///< read from the file and not yet handed on, from fTaken on
    std::size_t fTaken = 0;
};

#endif
