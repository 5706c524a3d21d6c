// Measure: computes the figures of a line from its samples.
#ifndef MORVIK_BENCH_MEASURE_H
#define MORVIK_BENCH_MEASURE_H

#include <vector>

#include "Clock.h"
#include "Work.h"

namespace morvik::bench {

struct Figures {
    double megabitsPerSecond;
    double cyclesPerBitAndIteration;
    double latency;  ///< per call, in microseconds of processor time
    double ratio;    ///< of a step of a pass to a probe step; 0 without a probe
    double bitErrorRate;
};

/// The median, of one or more values.
double median(std::vector<double> values);

/// The figures of one sample, a run over all blocks.
Figures figures(const Work& work, const Decoding& decoding, const Sample& sample, double limit);

/// The median of each figure.
Figures medians(const std::vector<Figures>& all);

}  // namespace morvik::bench

#endif
