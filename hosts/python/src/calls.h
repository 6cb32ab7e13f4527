#ifndef MCBINNING_CALLS_H
#define MCBINNING_CALLS_H

#include "hosts/python/src/blocks.h"

#include <mcobnqrt/ibinrecordsource.h>
#include <mcobnqrt/mccommon.h>
#include <mcobnqrt/mcquerycancel.h>
#include <mcobnqrt/progresslistener.h>

#include <nanobind/nanobind.h>

#include <chrono>
#include <cstddef>
#include <cstdint>
#include <exception>

/// Looks out for Ctrl-C and the stop button of a notebook, for a thread that works without the GIL.
class Interrupts
{
public:
    /// Whether there was one. Takes the GIL some ten times a second, and is cheap in between.
    bool Poll();

    bool IsFound() const { return fFound != nullptr; }

    /// Throws on what was found, a KeyboardInterrupt as a rule. With the GIL held.
    void Rethrow() const;

private:
    std::chrono::steady_clock::time_point fNextLook{};
    std::exception_ptr fFound;
};

/// Hands blocks to the library, record by record.
class BlockRecords : public IBINRecordSource
{
public:
    /// Both stay the caller's.
    BlockRecords(BlockSource& source, std::size_t numFields, Interrupts& interrupts);

    bool HasNext() override;
    const MCCommon::Record* Next() override;

    /// Whether the reading is over.
    bool IsAtEnd() const { return fIsAtEnd; }

    /// How many records were handed over.
    std::int64_t GetNumRecords() const { return fNumRecords; }

private:
    BlockSource& fSource;
    Interrupts& fInterrupts;
    Block fBlock;
    std::size_t fNextRow = 0;
    std::int64_t fNumRecords = 0;
    int fNumFields;
    MCCommon::Record fRecord;
    bool fIsAtEnd = false;
};

/// The library asks before each record. BlockRecords has polled by then, so this polls only after the last record.
class CancelOnInterrupt : public MCQueryCancel
{
public:
    CancelOnInterrupt(const BlockRecords& records, Interrupts& interrupts) : fRecords(records), fInterrupts(interrupts)
    {
    }

    bool QueryCancel() override;

private:
    const BlockRecords& fRecords;
    Interrupts& fInterrupts;
};

/// Calls a Python function with the name of the phase, "records" or "attributes", and the report's index. What it
/// raises ends the run.
class ProgressToPython : public ProgressListener
{
public:
    ProgressToPython(const BlockRecords& records, nanobind::object function)
        : fRecords(records), fFunction(std::move(function))
    {
    }

    void ReportProgress(ProgressReport& report) override;

private:
    const BlockRecords& fRecords;
    nanobind::object fFunction;
};

#endif
