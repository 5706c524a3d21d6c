// Completion: what lets shells complete the arguments of a program.
#ifndef MORVIK_APP_REFERENCE_COMPLETION_H
#define MORVIK_APP_REFERENCE_COMPLETION_H

#include <string>

#include "Facts.h"

namespace morvik::reference {

/// A function for bash, on those of the package bash-completion.
std::string bashCompletion(const CommandFacts& program);

/// A function for the completion system of zsh.
std::string zshCompletion(const CommandFacts& program);

}  // namespace morvik::reference

#endif
