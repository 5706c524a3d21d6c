// Checkers: morvik_checker.h for tests.
#ifndef MORVIK_TESTS_SUPPORT_CHECKERS_H
#define MORVIK_TESTS_SUPPORT_CHECKERS_H

#include <memory>
#include <string>
#include <vector>

#include "Blocks.h"
#include "morvik_checker.h"

namespace morvik::support {

struct DestroyChecker {
    void operator()(morvik_checker* checker) const
    {
        morvik_checker_destroy(checker);
    }
};

using Checker = std::unique_ptr<morvik_checker, DestroyChecker>;

inline Checker makeChecker(int units, int algorithm)
{
    return Checker(morvik_checker_create(units, algorithm));
}

inline int start(const Checker& checker, const blocks::Block& block, int iterations)
{
    for (std::size_t i = 0; i < block.sys.size(); ++i) {
        morvik_checker_put(checker.get(), block.sys[i], block.par1[i], block.par2[i]);
    }
    return morvik_checker_start(checker.get(), iterations);
}

inline std::vector<std::string> messagesOf(const Checker& checker)
{
    std::vector<std::string> messages;
    for (std::string text = morvik_checker_message(checker.get()); !text.empty();
         text = morvik_checker_message(checker.get())) {
        messages.push_back(text);
    }
    return messages;
}

}  // namespace morvik::support

#endif
