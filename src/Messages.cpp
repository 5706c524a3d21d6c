// Messages: the standard streams of the library.
#include "Messages.h"

#include <iostream>

namespace messages {

std::ostream& output()
{
    return std::cout;
}

std::ostream& error()
{
    return std::cerr;
}

}  // namespace messages
