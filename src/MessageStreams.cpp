// MessageStreams: the streams of messages, those of the process. A program linked from the library's objects can
// replace this file by its own.
#include <iostream>

#include "Messages.h"

namespace morvik::messages {

std::ostream& output()
{
    return std::cout;
}

std::ostream& error()
{
    return std::cerr;
}

}  // namespace morvik::messages
