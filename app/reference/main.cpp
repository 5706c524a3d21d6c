// morvik_reference: generates the manual pages and completions of the commands from their options.
//   morvik_reference FOLDER     writes FOLDER/PROGRAM/share/..., ready to install
#include <exception>
#include <filesystem>
#include <iostream>

#include "Completion.h"
#include "ManualPage.h"
#include "Programs.h"
#include "base/OutputFile.h"

namespace {

namespace fs = std::filesystem;

void write(const fs::path& file, const std::string& text)
{
    fs::create_directories(file.parent_path());
    morvik::base::OutputFile output(file.u8string());
    output.write(text);
    output.commit();
}

void writeReference(const fs::path& folder, const morvik::Program& program)
{
    const morvik::reference::CommandFacts facts = morvik::reference::factsOf(*program.arguments);
    const fs::path share = folder / facts.name / "share";
    fs::remove_all(folder / facts.name);  // removes pages of former subcommands
    for (const auto& [name, page] : manualPages(facts, MORVIK_VERSION)) {
        write(share / "man/man1" / name, page);
    }
    write(share / "bash-completion/completions" / facts.name, bashCompletion(facts));
    write(share / "zsh/site-functions" / ('_' + facts.name), zshCompletion(facts));
}

}  // namespace

int main(int argc, char** argv)
{
    if (argc != 2) {
        std::cerr << "morvik_reference FOLDER" << std::endl;
        return morvik::badInputOrUsage;
    }
    try {
        writeReference(argv[1], morvik::morvikProgram());
        writeReference(argv[1], morvik::morvikMpiProgram(nullptr));
    } catch (const std::exception& error) {
        std::cerr << "morvik_reference: " << error.what() << std::endl;
        return morvik::badInputOrUsage;
    }
    return morvik::success;
}
