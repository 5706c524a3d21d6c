// SampleCurves: synthetic error rates for the tests of plots and pages, with every feature that is drawn.
#ifndef MORVIK_TESTS_SUPPORT_SAMPLECURVES_H
#define MORVIK_TESTS_SUPPORT_SAMPLECURVES_H

#include <vector>

#include "report/Curves.h"

namespace morvik::support {

/// Two curves like those of a block of 512 bits, each ending in a point without errors, and a reference without
/// confidence intervals.
std::vector<report::Curve> sampleCurves();

/// The same with titles that look like markup, commands and string terminators; the last curve covers the one before.
std::vector<report::Curve> hostileCurves();

/// The samples after each of `iterations` iterations, at the given Eb/N0.
std::vector<report::Curve> iterationCurves(unsigned iterations, const std::vector<double>& decibels);

}  // namespace morvik::support

#endif
