// BashCompletion: generates a program's completion for bash.
#include <algorithm>
#include <map>

#include "Completion.h"

namespace morvik::reference {

namespace {

std::string joined(const std::vector<std::string>& words, const std::string& separator)
{
    std::string text;
    for (const std::string& word : words) {
        text += (text.empty() ? "" : separator) + word;
    }
    return text;
}

std::string functionOf(const CommandFacts& program)
{
    std::string name = '_' + program.name;
    std::replace(name.begin(), name.end(), '-', '_');
    return name;
}

/// The command that completes a value; empty for free text.
std::string actionFor(const OptionFacts& option, const std::string& function)
{
    if (!option.words.empty()) {
        const std::string words = '\'' + joined(option.words, " ") + '\'';
        return option.isList ? function + "_list " + words : "COMPREPLY=($(compgen -W " + words + " -- \"$cur\"))";
    }
    switch (option.files) {
    case Files::any:
        return option.ending.empty() ? "_filedir" : "_filedir " + option.ending.substr(1);
    case Files::folders:
        return "_filedir -d";
    case Files::none:
        break;
    }
    return "";
}

/// The cases of one subcommand for option values, grouped by action.
std::string valueCases(const CommandFacts& command, const std::string& function)
{
    std::map<std::string, std::vector<std::string>> optionsOf;
    for (const OptionFacts& option : command.options) {
        if (!option.value.empty()) {
            for (const std::string& name : option.names) {
                optionsOf[actionFor(option, function)].push_back(command.ownName() + ':' + name);
            }
        }
    }
    std::string text;
    for (const auto& [action, options] : optionsOf) {
        text += "        " + joined(options, " | ") + ")\n" + (action.empty() ? "" : "            " + action + '\n') +
                "            return ;;\n";
    }
    return text;
}

/// The case of one subcommand for words other than option values.
std::string argumentCase(const CommandFacts& command, const std::string& function)
{
    std::vector<std::string> names;
    for (const OptionFacts& option : command.options) {
        names.insert(names.end(), option.names.begin(), option.names.end());
    }
    std::string text = "        " + command.ownName() + ")\n            options='" + joined(names, " ") + "'\n";
    if (!command.positionals.empty()) {
        text +=
            "            [[ $cur == -* ]] || { " + actionFor(command.positionals.front(), function) + "; return; }\n";
    }
    return text + "            ;;\n";
}

}  // namespace

std::string bashCompletion(const CommandFacts& program)
{
    const std::string function = functionOf(program);
    std::vector<std::string> names;
    std::string values;
    std::string arguments;
    for (const CommandFacts& command : program.subcommands) {
        names.push_back(command.ownName());
        values += valueCases(command, function);
        arguments += argumentCase(command, function);
    }
    std::vector<std::string> first;
    for (const OptionFacts& option : program.options) {
        first.insert(first.end(), option.names.begin(), option.names.end());
    }
    return "# Completes the arguments of " + program.name +
           R"( in bash. Written by the build, from the command's own options.

# Completes the last element of a list with commas.
)" + function +
           R"(_list()
{
    local before=
    [[ $cur != *,* ]] || before=${cur%,*},
    COMPREPLY=($(compgen -P "$before" -W "$1" -- "${cur##*,}"))
    compopt -o nospace
}

)" + function +
           R"(()
{
    local cur prev words cword split
    _init_completion -s || return

    local subcommand= options i
    for ((i = 1; i < cword; ++i)); do
        case ${words[i]} in
            )" +
           joined(names, " | ") + R"()
                subcommand=${words[i]}
                break ;;
        esac
    done

    case $subcommand:$prev in
)" + values +
           R"(    esac
    $split && return

    case $subcommand in
)" + arguments +
           R"(        *)
            options=')" +
           joined(first, " ") + R"('
            [[ $cur == -* ]] || options=')" +
           joined(names, " ") + R"(' ;;
    esac
    COMPREPLY=($(compgen -W "$options" -- "$cur"))
} &&
    complete -F )" +
           function + ' ' + program.name + '\n';
}

}  // namespace morvik::reference
