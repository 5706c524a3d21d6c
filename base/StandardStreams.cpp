// StandardStreams: the descriptors 0, 1 and 2, which a program may be started without.
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
        // The lowest free number is this one. Opened the wrong way round, it fails as a closed stream does.
        if (open("/dev/null", stream == STDIN_FILENO ? O_WRONLY : O_RDONLY) != stream) {
            std::abort();
        }
    }
    std::signal(SIGXFSZ, SIG_IGN);
}

}  // namespace morvik::base
