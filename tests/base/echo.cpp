// Prints its arguments, each in angle brackets on a line, then its input; and a line of messages.
#include <iostream>
#include <string>

#include "base/System.h"

int main(int argc, char** argv)
{
    morvik::base::system::prepareProgram(argc, argv);
    for (int i = 1; i < argc; ++i) {
        std::cout << '<' << argv[i] << ">\n";
    }
    for (std::string line; std::getline(std::cin, line);) {
        std::cout << line;
    }
    std::cerr << "told\n";
    return std::cout.flush() ? 0 : 1;
}
