// MorvikDecoding: decoding by the library, through its C interfaces.
#ifndef MORVIK_BENCH_MORVIKDECODING_H
#define MORVIK_BENCH_MORVIKDECODING_H

#include "Work.h"

namespace morvik::bench {

std::unique_ptr<Decoding> makeMorvikDecoding(const Work& work);

}  // namespace morvik::bench

#endif
