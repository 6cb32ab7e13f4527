#ifndef MCOBNQRT_TESTS_FAULTYPLATFORM_H
#define MCOBNQRT_TESTS_FAULTYPLATFORM_H

#include "platform/platform.h"

#include <functional>

/// The real platform, but for the call that a test makes fail: the n-th of all that can fail, counted from 1, and with
/// `fFromThenOn` every one behind it too. RemoveFile works always: what fails there is nobody's to report.
class FaultyPlatform : public Platform
{
public:
    int fFailingCall = 0;        ///< 0: none
    int fFullAtWrite = 0;        ///< the disk is full at this write, counted from 1, and at no other one; 0: at none
    bool fIsToldAtClose = false; ///< the full disk shows not before the file is closed
    bool fFromThenOn = false;
    int fNumCalls = 0;
    bool fHasFired = false;
    int fNumOpened = 0; ///< files, by CreateNewFile and the like
    int fNumClosed = 0;
    std::int64_t fTick = 0; ///< of the clock, if it is not 0

    std::int64_t GetTickCount() override { return fTick != 0 ? fTick : fReal->GetTickCount(); }

    NameState ProbeName(const std::string& path) override
    {
        return Fails() ? NameState::kTooManyOpenFiles : fReal->ProbeName(path);
    }

    NameState CreateNewFile(const std::string& path, std::FILE*& file, FileIdentity& identity) override
    {
        const NameState state = Fails() ? NameState::kFailed : fReal->CreateNewFile(path, file, identity);
        fNumOpened += state == NameState::kFree ? 1 : 0;
        return state;
    }

    std::FILE* OpenForAppending(const std::string& path, const FileIdentity& identity, std::uint64_t size) override
    {
        return Opened(Fails() ? nullptr : fReal->OpenForAppending(path, identity, size));
    }

    std::FILE* OpenForReading(const std::string& path, const FileIdentity* identity) override
    {
        return Opened(Fails() ? nullptr : fReal->OpenForReading(path, identity));
    }

    std::size_t ReadDoubles(double* values, std::size_t count, std::FILE* file) override
    {
        return Fails() ? 0 : fReal->ReadDoubles(values, count, file);
    }

    std::size_t WriteDoubles(const double* values, std::size_t count, std::FILE* file) override
    {
        const bool isFull = ++fNumWrites == fFullAtWrite;
        return fReal->WriteDoubles(values, Fails() || (isFull && !fIsToldAtClose) ? count / 2 : count, file);
    }

    bool RewindFile(std::FILE* file) override { return !Fails() && fReal->RewindFile(file); }

    /// A close that fails closes the file all the same.
    bool CloseFile(std::FILE* file) override
    {
        const bool isClosed = fReal->CloseFile(file);
        ++fNumClosed;
        return !Fails() && isClosed && !(fIsToldAtClose && fNumWrites > 0 && fNumWrites == fFullAtWrite);
    }

    void RemoveFile(const std::string& path, const FileIdentity& identity) override
    {
        fReal->RemoveFile(path, identity);
    }

private:
    int fNumWrites = 0;

    bool Fails()
    {
        ++fNumCalls;
        const bool fails = fNumCalls == fFailingCall || (fFromThenOn && fFailingCall > 0 && fNumCalls > fFailingCall);
        fHasFired = fHasFired || fails;
        return fails;
    }

    std::FILE* Opened(std::FILE* file)
    {
        fNumOpened += file != nullptr ? 1 : 0;
        return file;
    }

    Platform* fReal = SystemPlatform();
};

#endif
