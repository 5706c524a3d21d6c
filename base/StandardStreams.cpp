// StandardStreams: the descriptors 0, 1 and 2, which may be closed when a program starts.
#include "StandardStreams.h"

#include <fcntl.h>
#include <unistd.h>

#include <cerrno>
#include <csignal>
#include <cstdlib>
#include <initializer_list>

namespace morvik::base {

void prepareStandardStreams()
{
    for (const int stream : {STDIN_FILENO, STDOUT_FILENO, STDERR_FILENO}) {
        if (fcntl(stream, F_GETFD) >= 0 || errno != EBADF) {
            continue;
        }
        // open() returns the lowest free number, this one. Using it in the other direction fails as on a closed stream.
        if (open("/dev/null", stream == STDIN_FILENO ? O_WRONLY : O_RDONLY) != stream) {
            std::abort();
        }
    }
    std::signal(SIGXFSZ, SIG_IGN);
}

}  // namespace morvik::base
