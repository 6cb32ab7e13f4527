#include "hosts/mcbin/interrupt.h"

#include <csignal>
#include <initializer_list>

namespace
{

volatile std::sig_atomic_t gInterrupted = 0;

void NoteSignal(int signal)
{
    if (gInterrupted != 0)
    {
        // The second one, of whatever kind, meets what the system does by itself, as soon as this has returned.
        std::signal(signal, SIG_DFL);
        std::raise(signal);
    }
    gInterrupted = 1;
}

} // namespace

void CatchSignals()
{
    struct sigaction action = {}; // without SA_RESTART, so that a wait for input ends
    action.sa_handler = NoteSignal;
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
