// ManualPage: generates a program's pages for man(1), in the macros of man(7).
#include "ManualPage.h"

#include <algorithm>
#include <cctype>
#include <sstream>
#include <vector>

namespace morvik::reference {

namespace {

// ---- Text

/// Escapes text for roff: no letter acts as a command, and quotes and circumflexes stay as they are. With `isCode`,
/// hyphens can be copied into a shell.
std::string escaped(const std::string& text, bool isCode)
{
    std::string result;
    for (const char letter : text) {
        switch (letter) {
        case '\\':
            result += "\\e";
            break;
        case '\'':
            result += "\\(aq";
            break;
        case '`':
            result += "\\(ga";
            break;
        case '^':
            result += "\\(ha";
            break;
        case '~':
            result += "\\(ti";
            break;
        case '-':
            result += isCode ? "\\-" : "-";
            break;
        default:
            result += letter;
        }
    }
    return (result.empty() || result[0] != '.' ? "" : "\\&") + result;
}

std::string code(const std::string& text)
{
    return escaped(text, true);
}

/// Text filled into one line. A word that begins with a dash, after quotes and brackets, is an option or a number.
std::string prose(const std::string& text)
{
    std::istringstream words(text);
    std::string word;
    std::string result;
    while (words >> word) {
        const std::size_t start = word.find_first_not_of("'\"([");
        const bool isCode = start != std::string::npos && word[start] == '-';
        result += (result.empty() ? "" : " ") + escaped(word, isCode);
    }
    return result;
}

std::string bold(const std::string& text)
{
    return "\\fB" + code(text) + "\\fR";
}

std::string italic(const std::string& text)
{
    return "\\fI" + code(text) + "\\fR";
}

std::string withFirst(int (*change)(int), std::string text)
{
    if (!text.empty()) {
        text[0] = static_cast<char>(change(static_cast<unsigned char>(text[0])));
    }
    return text;
}

std::string withDashes(std::string name)
{
    std::replace(name.begin(), name.end(), ' ', '-');
    return name;
}

std::string listed(const std::vector<std::string>& names)
{
    std::string list;
    for (const std::string& name : names) {
        list += (list.empty() ? "" : ", ") + bold(name);
    }
    return list;
}

// ---- The footer of the help text

struct Explanation {
    std::vector<std::string> paragraphs;
    std::string exitStatus;
    std::vector<std::string> examples;  // paragraphs, without their first word
};

std::vector<std::string> paragraphsOf(const std::string& text)
{
    std::vector<std::string> paragraphs(1);
    std::istringstream lines(text);
    std::string line;
    while (std::getline(lines, line)) {
        if (!line.empty()) {
            paragraphs.back() += line + '\n';
        } else if (!paragraphs.back().empty()) {
            paragraphs.emplace_back();
        }
    }
    if (paragraphs.back().empty()) {
        paragraphs.pop_back();
    }
    return paragraphs;
}

Explanation explanationOf(const std::string& footer)
{
    const std::string example = "Example:";
    const std::string status = "Exit status:";
    Explanation explanation;
    for (std::string paragraph : paragraphsOf(footer)) {
        if (paragraph.rfind(example, 0) == 0) {
            explanation.examples.push_back(paragraph.substr(example.size()));
            continue;
        }
        const std::size_t found = paragraph.find(status);
        if (found != std::string::npos) {
            explanation.exitStatus = paragraph.substr(found + status.size());
            paragraph.erase(found);
        }
        if (!paragraph.empty()) {
            explanation.paragraphs.push_back(paragraph);
        }
    }
    return explanation;
}

// ---- Sections

std::string heading(const CommandFacts& command, const std::string& version)
{
    const std::string name = withDashes(command.name);
    std::string title = name;
    std::transform(
        title.begin(), title.end(), title.begin(), [](unsigned char letter) { return std::toupper(letter); });
    std::string summary = withFirst(std::tolower, command.description);
    if (!summary.empty() && summary.back() == '.') {
        summary.pop_back();
    }
    return ".\\\" Written by the build, from the command's own options.\n.TH " + code(title) + " 1 \"\" \"morvik " +
           version + "\" \"morvik\"\n.SH NAME\n" + code(name) + " \\- " + prose(summary) + '\n';
}

/// The synopsis.
std::string usage(const CommandFacts& command)
{
    std::string line = bold(command.name) + " [" + italic("OPTIONS") + ']';
    for (const OptionFacts& positional : command.positionals) {
        const std::string name = italic(positional.value) + (positional.isRepeatable ? "..." : "");
        line += ' ' + (positional.isRequired ? name : '[' + name + ']');
    }
    return line + '\n';
}

std::string entry(const OptionFacts& option)
{
    const bool isPositional = option.names.front()[0] != '-';
    std::string names = isPositional ? italic(option.value) : listed(option.names);
    if (!isPositional && !option.value.empty()) {
        names += ' ' + italic(option.value);
    }
    std::string text = ".TP\n" + names + '\n' + prose(option.description) + ".\n";
    if (!option.defaultValue.empty()) {
        text += "Default: " + bold(option.defaultValue) + ".\n";
    }
    text += option.isRequired ? "Required.\n" : "";
    text += option.needs.empty() ? "" : "Needs " + listed(option.needs) + ".\n";
    text += option.excludes.empty() ? "" : "Excludes " + listed(option.excludes) + ".\n";
    return text;
}

std::string entries(const std::string& title, const std::vector<OptionFacts>& options)
{
    std::string text;
    for (const OptionFacts& option : options) {
        text += entry(option);
    }
    return text.empty() ? "" : ".SH " + title + '\n' + text;
}

std::string description(const std::vector<std::string>& paragraphs)
{
    std::string text;
    for (const std::string& paragraph : paragraphs) {
        text += (text.empty() ? ".SH DESCRIPTION\n" : ".PP\n") + prose(paragraph) + '\n';
    }
    return text;
}

std::string examples(const std::vector<std::string>& paragraphs)
{
    std::string text;
    for (const std::string& paragraph : paragraphs) {
        std::istringstream lines(paragraph);
        std::string line;
        std::getline(lines, line);
        const std::string title = prose(line);
        text += text.empty() ? ".SH EXAMPLES\n" : ".PP\n";
        text += title.empty() ? "" : withFirst(std::toupper, title) + ":\n.PP\n";
        text += ".nf\n.RS\n";
        while (std::getline(lines, line)) {
            text += code(line.substr(std::min(line.size(), line.find_first_not_of(' ')))) + '\n';
        }
        text += ".RE\n.fi\n";
    }
    return text;
}

std::string subcommands(const CommandFacts& program)
{
    std::string text = ".SH SUBCOMMANDS\n";
    for (const CommandFacts& subcommand : program.subcommands) {
        text += ".TP\n" + bold(subcommand.ownName()) + '\n' + prose(subcommand.description) + ": see " +
                bold(withDashes(subcommand.name)) + "(1).\n";
    }
    return text;
}

/// The program's other pages and, since they belong together, those of both programs.
std::string seeAlso(const CommandFacts& program, const CommandFacts& command)
{
    std::vector<std::string> pages = {"morvik", "morvik-mpi"};
    for (const CommandFacts& subcommand : program.subcommands) {
        pages.push_back(withDashes(subcommand.name));
    }
    if (program.subcommands.size() == 1) {
        pages.back() = "morvik-" + program.subcommands.front().ownName();
    }
    std::sort(pages.begin(), pages.end());
    std::string list;
    for (const std::string& page : pages) {
        if (page != withDashes(command.name)) {
            list += (list.empty() ? "" : ",\n") + bold(page) + "(1)";
        }
    }
    return ".SH SEE ALSO\n" + list +
           "\n.PP\nThe pages that are called docs/... are in the folder share/doc/morvik of an installation.\n";
}

std::string sections(const CommandFacts& command, const Explanation& explanation)
{
    return entries("ARGUMENTS", command.positionals) + entries("OPTIONS", command.options) +
           (explanation.exitStatus.empty() ? "" : ".SH EXIT STATUS\n" + prose(explanation.exitStatus) + '\n') +
           examples(explanation.examples);
}

std::string pageOf(const CommandFacts& program, const CommandFacts& command, const std::string& version)
{
    const Explanation explanation = explanationOf(command.footer);
    const bool isProgram = !command.subcommands.empty();
    return heading(command, version) + ".SH SYNOPSIS\n" +
           (isProgram ? bold(command.name) + ' ' + italic("SUBCOMMAND") + " [" + italic("OPTIONS") + "] [" +
                            italic("FILE") + "...]\n"
                      : usage(command)) +
           description(explanation.paragraphs) + (isProgram ? subcommands(command) : "") +
           sections(command, explanation) + seeAlso(program, command);
}

/// One page for a program and its only subcommand.
std::string singlePage(const CommandFacts& program, const std::string& version)
{
    CommandFacts command = program.subcommands.front();
    std::vector<OptionFacts>& options = command.options;
    options.insert(options.end(), program.options.begin() + 1, program.options.end());  // both begin with --help
    Explanation explanation = explanationOf(command.footer);
    explanation.examples = explanationOf(program.footer).examples;  // those of the subcommand name another program
    return heading(program, version) + ".SH SYNOPSIS\n" + usage(command) + description(explanation.paragraphs) +
           sections(command, explanation) + seeAlso(program, program);
}

}  // namespace

std::map<std::string, std::string> manualPages(const CommandFacts& program, const std::string& version)
{
    if (program.subcommands.size() == 1) {
        return {{program.name + ".1", singlePage(program, version)}};
    }
    std::map<std::string, std::string> pages = {{program.name + ".1", pageOf(program, program, version)}};
    for (const CommandFacts& command : program.subcommands) {
        pages[withDashes(command.name) + ".1"] = pageOf(program, command, version);
    }
    return pages;
}

}  // namespace morvik::reference
