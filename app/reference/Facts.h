// Facts: describes a command's arguments as plain data.
#ifndef MORVIK_APP_REFERENCE_FACTS_H
#define MORVIK_APP_REFERENCE_FACTS_H

#include <CLI/CLI.hpp>
#include <string>
#include <vector>

namespace morvik::reference {

/// The files that an option's value names.
enum class Files { none, any, folders };

struct OptionFacts {
    std::vector<std::string> names;  // such as -h and --help; without dashes for a positional argument
    std::string value;               // a name for the value, empty for a flag
    std::string description;
    std::string defaultValue;
    std::vector<std::string> words;  // values to complete
    bool isList = false;             // whether the value is a comma-separated list of them
    bool isRequired = false;
    bool isRepeatable = false;
    std::vector<std::string> needs;     // names of options
    std::vector<std::string> excludes;  // the same
    Files files = Files::none;
    std::string ending;  // their extension, such as .csv; empty for any
};

struct CommandFacts {
    std::string name;  // as typed: "morvik", "morvik decode"
    std::string description;
    std::vector<OptionFacts> options;
    std::vector<OptionFacts> positionals;
    std::string footer;  // the end of the help text
    std::vector<CommandFacts> subcommands;

    /// The name without the program's before it.
    std::string ownName() const;
};

CommandFacts factsOf(CLI::App& app);

}  // namespace morvik::reference

#endif
