// StandardStreams: the descriptors 0, 1 and 2, which a program may be started without.
#ifndef MORVIK_BASE_STANDARDSTREAMS_H
#define MORVIK_BASE_STANDARDSTREAMS_H

namespace morvik::base {

/// Gives those that are closed to something that can be neither read nor written. Otherwise the first files that the
/// program opens would get their numbers, and what is printed would go into them. Also lets a file that grows beyond
/// the limit of the process fail to be written, as on a full disk, where the signal would end the program. For the
/// beginning of main.
void prepareStandardStreams();

}  // namespace morvik::base

#endif
