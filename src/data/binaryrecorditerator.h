#ifndef MCOBNQRT_BINARYRECORDITERATOR_H
#define MCOBNQRT_BINARYRECORDITERATOR_H

#include "platform/platform.h"

#include <cstdio>
#include <string>

namespace MCBinning
{

/// Reads a temporary file, a headerless run of doubles, from first to last, as often as wanted. One value is always read
/// ahead, so that IsOK() can say that a value is left before it is asked for.
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

    /// Opens the file and reads the first value ahead. If that fails the object exists all the same, and has no value.
    /// With an `identity` only that very file is opened. The platform outlives the iterator.
    explicit BinaryRecordIterator(const std::string& path, Platform* platform = SystemPlatform(),
                                  const FileIdentity* identity = nullptr);
    BinaryRecordIterator(const BinaryRecordIterator&) = delete;
    BinaryRecordIterator& operator=(const BinaryRecordIterator&) = delete;
    /// Closes the file and leaves it on disk.
    ~BinaryRecordIterator();

    /// Whether Next() still has a value to give.
    virtual bool IsOK();

    /// The next value; 0.0 once IsOK() is false.
    virtual double Next();

    virtual int GetStatus();

    /// Goes back to the first value, after an end or a failed read too. \return the new status; without a file it stays
    /// kFailed.
    virtual int Rewind();

    /// Whether the file could be opened.
    bool HasFile() const { return fFile != nullptr; }

private:
    int ReadNext();

    double fCurrent = 0.0;   ///< what Next() hands out
    double fLookahead = 0.0; ///< the value read ahead
    std::FILE* fFile = nullptr;
    int fFieldsPerRecord = 1; ///< elements per read; fLookahead holds one
    int fRecordStatus = kMoreToCome;
    std::string fFileName;
    Platform* fPlatform;
};

} // namespace MCBinning

#endif
