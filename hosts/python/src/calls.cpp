#include "hosts/python/src/calls.h"

#include <mcobnqrt/progressreport.h>

namespace nb = nanobind;

bool Interrupts::Poll()
{
    const auto now = std::chrono::steady_clock::now();
    if (fFound || now < fNextLook)
        return fFound != nullptr;
    fNextLook = now + std::chrono::milliseconds(100);
    const nb::gil_scoped_acquire gil;
    if (PyErr_CheckSignals() != 0)
        fFound = std::make_exception_ptr(nb::python_error());
    return fFound != nullptr;
}

void Interrupts::Rethrow() const
{
    if (fFound)
        std::rethrow_exception(fFound);
}

BlockRecords::BlockRecords(BlockSource& source, std::size_t numFields, Interrupts& interrupts)
    : fSource(source), fInterrupts(interrupts), fBlock(numFields), fNumFields(static_cast<int>(numFields)),
      fRecord(fNumFields)
{
}

bool BlockRecords::HasNext()
{
    if (fNextRow < fBlock.numRows)
        return true;
    fNextRow = 0;
    fInterrupts.Poll();
    fIsAtEnd = fIsAtEnd || !fSource.Next(fBlock);
    return !fIsAtEnd;
}

const MCCommon::Record* BlockRecords::Next()
{
    if (!HasNext())
        return nullptr;
    for (int field = 0; field < fNumFields; ++field)
        fRecord[field] = fBlock.At(static_cast<std::size_t>(field), fNextRow);
    ++fNextRow;
    ++fNumRecords;
    return &fRecord;
}

bool CancelOnInterrupt::QueryCancel()
{
    return fRecords.IsAtEnd() ? fInterrupts.Poll() : fInterrupts.IsFound();
}

void ProgressToPython::ReportProgress(ProgressReport& report)
{
    const nb::gil_scoped_acquire gil;
    fFunction(fRecords.IsAtEnd() ? "attributes" : "records", report.DiscreteMeasure("IndexVar"));
}
