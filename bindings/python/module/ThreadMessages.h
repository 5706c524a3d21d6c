// ThreadMessages: the library's messages, kept for the caller instead of written to the process's streams.
//
// The module is linked from the library's objects, with this unit in place of src/MessageStreams.cpp. Each thread has
// its own streams, so a message always belongs to the call that caused it.
#ifndef MORVIK_BINDINGS_PYTHON_MODULE_THREADMESSAGES_H
#define MORVIK_BINDINGS_PYTHON_MODULE_THREADMESSAGES_H

#include <string>
#include <vector>

namespace morvik::python {

/// Messages of one thread, without the library's prefix: "ERROR:decoder:".
struct Messages {
    std::string error;  ///< the first one, or empty
    std::vector<std::string> warnings;
};

/// The messages of this thread since the last call.
Messages takeMessages();

}  // namespace morvik::python

#endif
