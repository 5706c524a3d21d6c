// SampleCurves: made-up error rates for the tests of plots and pages, with everything in them that is drawn.
#ifndef MORVIK_TESTS_SUPPORT_SAMPLECURVES_H
#define MORVIK_TESTS_SUPPORT_SAMPLECURVES_H

#include <vector>

#include "report/Curves.h"

namespace morvik::support {

/// Two curves that fall as those of a block of 512 bits do, each ending in a point without errors, and a reference,
/// which has no confidence intervals.
std::vector<report::Curve> sampleCurves();

/// The same with titles that try to be markup, commands and strings' ends, the last curve covering the one before.
std::vector<report::Curve> hostileCurves();

/// The samples after each of `iterations` iterations, at some Eb/N0.
std::vector<report::Curve> iterationCurves(unsigned iterations, const std::vector<double>& decibels);

}  // namespace morvik::support

#endif
