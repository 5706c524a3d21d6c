// Interruption: signals that ask the process to end, taken as a wish that is looked at now and then.
#ifndef MORVIK_APP_BER_INTERRUPTION_H
#define MORVIK_APP_BER_INTERRUPTION_H

namespace morvik {

/// Notes SIGINT, SIGTERM and SIGHUP for as long as it lives; one object at a time. A second signal of a kind ends the
/// process at once. Signals that the process ignores are left so.
class Interruption {
public:
    Interruption();
    Interruption(const Interruption&) = delete;
    Interruption& operator=(const Interruption&) = delete;
    ~Interruption();

    /// The signal that has come, or 0.
    static int signal();
};

}  // namespace morvik

#endif
