// Interruption: records signals that ask the process to end, for polling.
#include "Interruption.h"

#include <csignal>

namespace morvik {

namespace {

constexpr int signals[] = {SIGINT, SIGTERM, SIGHUP};

volatile std::sig_atomic_t arrived = 0;

extern "C" void note(int signal)
{
    arrived = signal;
}

/// Replaces the handler of those signals whose handler is `present`.
void replaceHandler(void (*present)(int), void (*next)(int), int flags)
{
    for (const int signal : signals) {
        struct sigaction action = {};
        sigaction(signal, nullptr, &action);
        if (action.sa_handler == present) {
            action.sa_handler = next;
            action.sa_flags = flags;
            sigemptyset(&action.sa_mask);
            sigaction(signal, &action, nullptr);
        }
    }
}

}  // namespace

Interruption::Interruption()
{
    arrived = 0;
    replaceHandler(SIG_DFL, note, static_cast<int>(SA_RESETHAND | SA_RESTART));
}

Interruption::~Interruption()
{
    replaceHandler(note, SIG_DFL, 0);
}

int Interruption::signal()
{
    return arrived;
}

}  // namespace morvik
