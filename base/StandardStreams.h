// StandardStreams: the descriptors 0, 1 and 2, which may be closed when a program starts.
#ifndef MORVIK_BASE_STANDARDSTREAMS_H
#define MORVIK_BASE_STANDARDSTREAMS_H

namespace morvik::base {

/// Opens closed streams on /dev/null in the wrong direction, so that using them still fails. Otherwise the first files
/// that the program opens would get their numbers and receive what is printed. Also ignores SIGXFSZ: writing beyond the
/// file size limit then fails as on a full disk, instead of ending the program. Call at the beginning of main.
void prepareStandardStreams();

}  // namespace morvik::base

#endif
