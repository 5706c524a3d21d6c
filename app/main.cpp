// morvik: the command line of the decoder model.
#include "Main.h"

int main(int argc, char** argv)
{
    return morvik::runMorvik(argc, argv);
}
