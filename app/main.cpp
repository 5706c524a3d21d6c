// morvik: the command line of the decoder model.
#include <iostream>

#include "CommandLine.h"
#include "Decode.h"
#include "Trace.h"
#include "Vectors.h"
#include "ber/Ber.h"
#include "ber/Merge.h"
#include "compare/Compare.h"
#include "doctor/Doctor.h"
#include "info/Info.h"
#include "selftest/SelfTest.h"

int main(int argc, char** argv)
{
    std::ios::sync_with_stdio(false);  // a trace writes millions of small pieces

    CLI::App app("The bit-accurate model of the morvik LTE turbo decoder, at the command line.", "morvik");
    app.set_version_flag("--version", "morvik " MORVIK_VERSION, "Print the version and exit");
    app.require_subcommand(0, 1);  // so that a file may bear the name of a subcommand
    app.footer("Example:\n  morvik decode k40.csv --reference k40.bits\n\n'morvik SUBCOMMAND --help' tells the rest.");
    return morvik::runCommandLine(app,
                                  {
                                      morvik::addDecode(app),
                                      morvik::addBer(app),
                                      morvik::addMerge(app),
                                      morvik::addVectors(app),
                                      morvik::addTrace(app),
                                      morvik::addCompare(app),
                                      morvik::addDoctor(app),
                                      morvik::addInfo(app),
                                      morvik::addSelfTest(app),
                                  },
                                  argc,
                                  argv);
}
