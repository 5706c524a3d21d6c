// ZshCompletion: generates a program's completion for zsh, with its function _arguments.
#include <algorithm>

#include "Completion.h"

namespace morvik::reference {

namespace {

/// Puts a backslash before each of the letters.
std::string escaped(const std::string& text, const std::string& letters)
{
    std::string result;
    for (const char letter : text) {
        result += (letters.find(letter) == std::string::npos ? "" : "\\") + std::string(1, letter);
    }
    return result;
}

/// Puts the text in single quotes.
std::string quoted(const std::string& text)
{
    std::string result;
    for (const char letter : text) {
        result += letter == '\'' ? "'\\''" : std::string(1, letter);
    }
    return '\'' + result + '\'';
}

/// The action that completes a value; follows its name.
std::string actionFor(const OptionFacts& option)
{
    std::string words;
    for (const std::string& word : option.words) {
        words += ' ' + word;
    }
    if (!words.empty()) {
        return option.isList ? "_sequence compadd -" + words : '(' + words.substr(1) + ')';
    }
    switch (option.files) {
    case Files::any:
        return option.ending.empty() ? "_files" : "_files -g \"*" + option.ending + '"';
    case Files::folders:
        return "_files -/";
    case Files::none:
        break;
    }
    return " ";  // only shows the name of the value
}

std::string valueOf(const OptionFacts& option)
{
    return ':' + escaped(option.value, ":\\[]") + ':' + actionFor(option);
}

/// The specifications of an option, one per name.
std::string optionLines(const OptionFacts& option)
{
    std::string shut;  // what it excludes from here on
    for (const auto& names : {option.names, option.excludes}) {
        for (const std::string& name : names) {
            shut += (shut.empty() ? "" : " ") + name;
        }
    }
    const std::string before = option.isRepeatable ? "*" : '(' + shut + ')';
    std::string text;
    for (const std::string& name : option.names) {
        const std::string explained =
            before + name + (option.value.empty() ? "" : "=") + '[' + escaped(option.description, "[]\\") + ']';
        text +=
            "                        " + quoted(explained + (option.value.empty() ? "" : valueOf(option))) + " \\\n";
    }
    return text;
}

std::string subcommandCase(const CommandFacts& command)
{
    std::string text = "                (" + command.ownName() + ")\n                    _arguments -S \\\n";
    for (const OptionFacts& option : command.options) {
        text += optionLines(option);
    }
    for (const OptionFacts& positional : command.positionals) {
        const std::string count = positional.isRepeatable ? "*" : positional.isRequired ? "1" : "1:";
        text += "                        " + quoted(count + valueOf(positional)) + " \\\n";
    }
    return text + "                        && ret=0 ;;\n";
}

}  // namespace

std::string zshCompletion(const CommandFacts& program)
{
    std::string function = '_' + program.name;
    std::string described;
    std::string cases;
    for (const CommandFacts& command : program.subcommands) {
        described += "                " + quoted(command.ownName() + ':' + command.description) + '\n';
        cases += subcommandCase(command);
    }
    std::string options;
    for (const OptionFacts& option : program.options) {
        for (const std::string& name : option.names) {
            options += "        " + quoted("(- :)" + name + '[' + escaped(option.description, "[]\\") + ']') + " \\\n";
        }
    }
    return "#compdef " + program.name + "\n# Completes the arguments of " + program.name +
           R"( in zsh. Written by the build, from the command's own options.

)" + function +
           R"(()
{
    local curcontext=$curcontext context state state_descr ret=1
    local -a line subcommands
    local -A opt_args

    _arguments -C \
)" + options +
           R"(        '1: :->subcommand' \
        '*:: :->arguments' && ret=0

    case $state in
        (subcommand)
            subcommands=(
)" + described +
           R"(            )
            _describe -t commands subcommand subcommands && ret=0 ;;
        (arguments)
            case $line[1] in
)" + cases +
           R"(            esac ;;
    esac
    return ret
}

)" + function +
           " \"$@\"\n";
}

}  // namespace morvik::reference
