#ifndef MCBIN_INPUTFILE_H
#define MCBIN_INPUTFILE_H

#include <cstddef>
#include <cstdio>
#include <memory>
#include <string>

/// A file that can be read more than once. All operations throw a Failure that names it where the system refuses.
class InputFile
{
public:
    /// Opens the file, which must be a regular one.
    explicit InputFile(const std::string& path);

    /// Copies standard input to a file in `directory` that no other process can open and that has no name, so that it
    /// can't stay behind. An empty `directory` stands for the system's.
    static InputFile SpoolStandardInput(const std::string& directory);

    /// Fills `buffer` unless the file ends before, and gives the number of bytes.
    std::size_t Read(char* buffer, std::size_t size);

    void Rewind();

    const std::string& GetName() const { return fName; }

private:
    struct Closer
    {
        void operator()(std::FILE* file) const { std::fclose(file); }
    };

    InputFile(std::string name, std::FILE* file);

    std::string fName;
    std::unique_ptr<std::FILE, Closer> fFile;
};

#endif
