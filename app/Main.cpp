// Main: the program `morvik`.
#include "Main.h"

#include <iostream>

#include "CommandLine.h"
#include "Programs.h"
#include "base/System.h"

namespace morvik {

int runMorvik(int argc, char** argv)
{
    base::system::prepareProgram(argc, argv);
    std::ios::sync_with_stdio(false);  // a trace makes millions of small writes

    const Program program = morvikProgram();
    return runCommandLine(*program.arguments, program.commands, argc, argv);
}

}  // namespace morvik
