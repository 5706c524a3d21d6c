// morvik: the command line of the decoder model.
#include <iostream>

#include "CommandLine.h"
#include "Programs.h"
#include "base/System.h"

int main(int argc, char** argv)
{
    morvik::base::system::prepareProgram(argc, argv);
    std::ios::sync_with_stdio(false);  // a trace makes millions of small writes

    const morvik::Program program = morvik::morvikProgram();
    return morvik::runCommandLine(*program.arguments, program.commands, argc, argv);
}
