#include "interrupt.h"

#include <csignal>
#include <initializer_list>

namespace
{

volatile std::sig_atomic_t gInterrupted = 0;

void NoteSignal(int)
{
    gInterrupted = 1;
}

} // namespace

void CatchSignals()
{
    struct sigaction action = {};
    action.sa_handler = NoteSignal;
    // The second one meets what the system does by itself. Without SA_RESTART, so that a wait for input ends.
    action.sa_flags = static_cast<int>(SA_RESETHAND);
    for (const int signal : {SIGINT, SIGTERM, SIGHUP})
    {
        struct sigaction former = {};
        // A program started in the background, or by nohup, is to be left alone.
        if (sigaction(signal, nullptr, &former) == 0 && former.sa_handler != SIG_IGN)
            sigaction(signal, &action, nullptr);
    }
    std::signal(SIGPIPE, SIG_IGN);
    std::signal(SIGXFSZ, SIG_IGN);
}

bool IsInterrupted()
{
    return gInterrupted != 0;
}

void ThrowIfInterrupted()
{
    if (IsInterrupted())
        throw Interrupted();
}
