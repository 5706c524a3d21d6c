// Facts: describes a command's arguments as plain data.
#include "Facts.h"

#include <algorithm>
#include <set>

#include "Arguments.h"

namespace morvik::reference {

namespace {

/// The name by which other options refer to this one, a long one if there is one.
std::string mainName(const CLI::Option& option)
{
    return option.get_lnames().empty() ? option.get_name() : "--" + option.get_lnames().front();
}

std::vector<std::string> mainNames(const std::set<CLI::Option*>& options)
{
    std::vector<std::string> names;
    names.reserve(options.size());
    for (const CLI::Option* const option : options) {
        names.push_back(mainName(*option));
    }
    std::sort(names.begin(), names.end());  // the order of a set of pointers varies between runs
    return names;
}

std::vector<std::string> namesOf(const CLI::Option& option)
{
    std::vector<std::string> names;
    for (const std::string& name : option.get_snames()) {
        names.push_back("-" + name);
    }
    for (const std::string& name : option.get_lnames()) {
        names.push_back("--" + name);
    }
    if (names.empty()) {
        names.push_back(option.get_name());
    }
    return names;
}

/// Derives the kind of files from the name of the value: FILE, FILE.csv, DIR.
void tellFiles(OptionFacts& facts)
{
    if (facts.value.rfind("FILE", 0) == 0) {
        facts.files = Files::any;
        facts.ending = facts.value.substr(4);
    } else if (facts.value == "DIR") {
        facts.files = Files::folders;
    }
}

OptionFacts factsOf(CLI::Option& option)
{
    OptionFacts facts;
    facts.names = namesOf(option);
    if (option.get_type_size() > 0) {
        facts.value = option.get_positional() ? option.get_name() : option.get_type_name();
    }
    facts.description = option.get_description();
    facts.defaultValue = option.get_default_str();
    facts.words = morvik::offered(option);
    facts.isList = facts.value.find("[,") != std::string::npos;
    facts.isRequired = option.get_required();
    facts.isRepeatable = option.get_expected_max() >= CLI::detail::expected_max_vector_size;
    facts.needs = mainNames(option.get_needs());
    facts.excludes = mainNames(option.get_excludes());
    tellFiles(facts);
    return facts;
}

CommandFacts factsOf(CLI::App& app, const std::string& prefix)
{
    CommandFacts facts;
    facts.name = prefix + app.get_name();
    facts.description = app.get_description();
    facts.footer = app.get_footer();
    for (CLI::Option* const option : app.get_options()) {
        (option->get_positional() ? facts.positionals : facts.options).push_back(factsOf(*option));
    }
    for (CLI::App* const subcommand : app.get_subcommands({})) {
        facts.subcommands.push_back(factsOf(*subcommand, facts.name + ' '));
    }
    return facts;
}

}  // namespace

std::string CommandFacts::ownName() const
{
    return name.substr(name.rfind(' ') + 1);
}

CommandFacts factsOf(CLI::App& app)
{
    return factsOf(app, "");
}

}  // namespace morvik::reference
