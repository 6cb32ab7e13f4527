#ifndef MCOBNQRT_BINARYRECORDITERATOR_H
#define MCOBNQRT_BINARYRECORDITERATOR_H

#include "platform/file.h"

#include <cstddef>
#include <string>
#include <vector>

namespace MCBinning
{

/// Reads a temporary file, a headerless run of doubles, from first to last, as often as wanted. The file is read in
/// blocks, and always ahead, so that IsOK() can say that a value is left before it is asked for.
class BinaryRecordIterator final
{
public:
    /// Values of GetStatus().
    enum Status
    {
        kMoreToCome = 0,
        kEndOfFile = 1,
        kFailed = 3 ///< the file couldn't be opened, or not be read
    };

    /// Opens the file and reads the first values ahead. If that fails the object exists all the same, and has no value.
    /// With an `identity` only that very file is opened. The platform outlives the iterator.
    explicit BinaryRecordIterator(const std::string& path, Platform* platform = SystemPlatform(),
                                  const FileIdentity* identity = nullptr);
    BinaryRecordIterator(const BinaryRecordIterator&) = delete;
    BinaryRecordIterator& operator=(const BinaryRecordIterator&) = delete;

    /// Whether Next() still has a value to give.
    bool IsOK() const;

    /// The next value; 0.0 once IsOK() is false.
    double Next();

    int GetStatus() const;

    /// The values that are read ahead and how many they are, at least one while IsOK().
    const double* GetBlock() const { return fBlock.data() + fNextValue; }
    std::size_t GetBlockSize() const { return fBlockSize - fNextValue; }

    /// Moves behind the first `count` values of the block.
    void Skip(std::size_t count);

    /// Goes back to the first value, after an end or a failed read too. \return the new status; without a file it stays
    /// kFailed.
    int Rewind();

    /// Whether the file could be opened.
    bool HasFile() const { return fFile.IsOpen(); }

private:
    int ReadBlock();

    std::vector<double> fBlock;
    std::size_t fBlockSize = 0; ///< values that the block holds
    std::size_t fNextValue = 0; ///< index in the block of what Next() hands out
    File fFile;
    int fRecordStatus = kMoreToCome;
};

} // namespace MCBinning

#endif
