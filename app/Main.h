// Main: the program `morvik`, for a main that needs no other header.
#ifndef MORVIK_APP_MAIN_H
#define MORVIK_APP_MAIN_H

namespace morvik {

/// Runs the subcommand that the arguments name. Returns the exit status.
int runMorvik(int argc, char** argv);

}  // namespace morvik

#endif
