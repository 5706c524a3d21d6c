// NoItppDecoding: replaces ItppDecoding if IT++ is not installed.
#include <stdexcept>

#include "ItppDecoding.h"

namespace morvik::bench {

bool itppAvailable()
{
    return false;
}

std::unique_ptr<Decoding> makeItppDecoding(const Work& work)
{
    throw std::runtime_error(work.name() + ": built without IT++");
}

}  // namespace morvik::bench
