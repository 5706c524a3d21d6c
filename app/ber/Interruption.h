// Interruption: records signals that ask the process to end, for polling.
#ifndef MORVIK_APP_BER_INTERRUPTION_H
#define MORVIK_APP_BER_INTERRUPTION_H

namespace morvik {

/// Records SIGINT, SIGTERM and SIGHUP, or what Windows has in their place, during its lifetime; one object at a time. A
/// second signal of the same kind ends the process at once. Signals that the process ignores stay ignored.
class Interruption {
public:
    Interruption();
    Interruption(const Interruption&) = delete;
    Interruption& operator=(const Interruption&) = delete;
    ~Interruption();

    /// The signal received, or 0.
    static int signal();
};

}  // namespace morvik

#endif
