// ManualPage: generates a program's pages for man(1).
#ifndef MORVIK_APP_REFERENCE_MANUALPAGE_H
#define MORVIK_APP_REFERENCE_MANUALPAGE_H

#include <map>
#include <string>

#include "Facts.h"

namespace morvik::reference {

/// Returns the pages by file name: one for the program and one for each subcommand. A program with a single subcommand
/// gets one page for both.
///
/// The footer of a help text holds the explanation, in paragraphs. The text from "Exit status:" to the end of its
/// paragraph, and paragraphs that begin with "Example:", become sections of their own.
std::map<std::string, std::string> manualPages(const CommandFacts& program, const std::string& version);

}  // namespace morvik::reference

#endif
