// ManualPage: the pages of a program for man(1).
#ifndef MORVIK_APP_REFERENCE_MANUALPAGE_H
#define MORVIK_APP_REFERENCE_MANUALPAGE_H

#include <map>
#include <string>

#include "Facts.h"

namespace morvik::reference {

/// The pages by the names of their files: one for the program and one for each subcommand. A program that has a single
/// subcommand is told on one page.
///
/// The end of a help text has the explanation, in paragraphs. From "Exit status:" to the end of its paragraph, and the
/// paragraphs that begin with "Example:", become sections of their own.
std::map<std::string, std::string> manualPages(const CommandFacts& program, const std::string& version);

}  // namespace morvik::reference

#endif
