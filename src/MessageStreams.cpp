// MessageStreams: the streams that messages go to, those of the process. A program that is linked from the library's
// objects can have a unit of its own in this one's place.
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
