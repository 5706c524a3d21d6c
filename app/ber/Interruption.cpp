// Interruption: records signals that ask the process to end, for polling.
#include "Interruption.h"

#include <csignal>

#include "base/System.h"

namespace morvik {

namespace {

volatile std::sig_atomic_t arrived = 0;

extern "C" void note(int signal)
{
    arrived = signal;
}

}  // namespace

Interruption::Interruption()
{
    arrived = 0;
    base::system::watchEndRequests(note);
}

Interruption::~Interruption()
{
    base::system::unwatchEndRequests(note);
}

int Interruption::signal()
{
    return arrived;
}

}  // namespace morvik
