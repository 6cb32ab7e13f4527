#ifndef MCBIN_INTERRUPT_H
#define MCBIN_INTERRUPT_H

#include <mcobnqrt/mcquerycancel.h>

/// From now on the first Ctrl-C, or another signal that asks for the end, only sets the flag that IsInterrupted()
/// reads; the second one ends the program at once. Writing to a closed pipe, or beyond the largest file, becomes an
/// ordinary error.
void CatchSignals();

bool IsInterrupted();

/// Thrown where there is nothing to show for the work so far; main() ends with the exit code for it.
struct Interrupted
{
};

void ThrowIfInterrupted();

/// Cancels a run of the library when IsInterrupted().
class InterruptQuery : public MCQueryCancel
{
public:
    bool QueryCancel() override { return IsInterrupted(); }
};

#endif
