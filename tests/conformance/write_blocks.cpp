// write_blocks: writes the conformance file to the standard output stream; with an argument, compares it with that
// file and exits with 1 when they differ.
#include <cstdio>
#include <exception>
#include <fstream>
#include <iterator>
#include <string>

#include "Cases.h"

int main(int argc, char** argv)
{
    try {
        const std::string text = morvik::conformance::textOf(morvik::conformance::makeCases());
        if (argc < 2) {
            std::fwrite(text.data(), 1, text.size(), stdout);
            return 0;
        }
        std::ifstream file(argv[1], std::ios::binary);
        if (std::string(std::istreambuf_iterator<char>(file), {}) == text) {
            return 0;
        }
        std::fprintf(stderr, "%s is not what this program writes\n", argv[1]);
    } catch (const std::exception& error) {
        std::fprintf(stderr, "write_blocks: %s\n", error.what());
    }
    return 1;
}
