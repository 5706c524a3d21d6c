// Environment: numbers from the environment that vary a test with random blocks.
#ifndef MORVIK_TESTS_SUPPORT_ENVIRONMENT_H
#define MORVIK_TESTS_SUPPORT_ENVIRONMENT_H

#include <cstdlib>

inline unsigned fromEnvironment(const char* name, unsigned otherwise)
{
    const char* value = std::getenv(name);
    return value == nullptr ? otherwise : static_cast<unsigned>(std::strtoul(value, nullptr, 10));
}

#endif
