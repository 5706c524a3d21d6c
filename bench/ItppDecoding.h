// ItppDecoding: IT++'s turbo decoder on the same blocks, for comparison.
#ifndef MORVIK_BENCH_ITPPDECODING_H
#define MORVIK_BENCH_ITPPDECODING_H

#include "Work.h"

namespace morvik::bench {

/// Whether the program was built with IT++.
bool itppAvailable();

std::unique_ptr<Decoding> makeItppDecoding(const Work& work);

}  // namespace morvik::bench

#endif
