// OutputTurn: who redirects the process's standard streams.
#ifndef MORVIK_BASE_OUTPUTTURN_H
#define MORVIK_BASE_OUTPUTTURN_H

#include <mutex>

namespace morvik::base {

/// Held while std::cout and std::cerr write elsewhere: there is one of each in a process.
inline std::mutex& outputTurn()
{
    static std::mutex turn;
    return turn;
}

}  // namespace morvik::base

#endif
