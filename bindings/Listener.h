// Listener: captures what the library writes on the standard streams.
#ifndef MORVIK_BINDINGS_LISTENER_H
#define MORVIK_BINDINGS_LISTENER_H

#include <iostream>
#include <sstream>
#include <string>

namespace morvik {

/// Captures during its lifetime. The streams are process-wide: one at a time.
class Listener {
public:
    Listener() : itsOutput(std::cout.rdbuf(&itsText)), itsError(std::cerr.rdbuf(&itsText)) {}

    ~Listener()
    {
        std::cout.rdbuf(itsOutput);
        std::cerr.rdbuf(itsError);
    }

    Listener(const Listener&) = delete;
    Listener& operator=(const Listener&) = delete;

    std::string text() const
    {
        return itsText.str();
    }

private:
    std::stringbuf itsText;
    std::streambuf* itsOutput;
    std::streambuf* itsError;
};

}  // namespace morvik

#endif
