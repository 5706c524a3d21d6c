// Completion: generates shell completions for a program.
#ifndef MORVIK_APP_REFERENCE_COMPLETION_H
#define MORVIK_APP_REFERENCE_COMPLETION_H

#include <string>

#include "Facts.h"

namespace morvik::reference {

/// A bash function that uses those of the package bash-completion.
std::string bashCompletion(const CommandFacts& program);

/// A function for zsh's completion system.
std::string zshCompletion(const CommandFacts& program);

}  // namespace morvik::reference

#endif
