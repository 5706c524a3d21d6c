// Measure: from samples to the figures of a line.
#ifndef MORVIK_BENCH_MEASURE_H
#define MORVIK_BENCH_MEASURE_H

#include <vector>

#include "Clock.h"
#include "Work.h"

namespace morvik::bench {

struct Figures {
    double megabitsPerSecond;
    double cyclesPerBitAndIteration;
    double latency;  ///< of a call, in microseconds of processor time
    double ratio;    ///< of a pass's step to one of the probe; 0 when there is no probe for it
    double bitErrorRate;
};

/// The middle one, or of an even number the mean of the two in the middle; takes one value or more.
double median(std::vector<double> values);

/// The figures of one sample, of a run over all blocks.
Figures figures(const Work& work, const Decoding& decoding, const Sample& sample, double limit);

/// Each figure's median.
Figures medians(const std::vector<Figures>& all);

/// Throws when the decisions are so bad that the figures stand for nothing: without a decoder, more than
/// every sixth bit would be wrong.
void checkDecisions(const Work& work, double bitErrorRate);

}  // namespace morvik::bench

#endif
