// RatioScale: the default scale of log-likelihood ratios.
#ifndef MORVIK_LINK_RATIOSCALE_H
#define MORVIK_LINK_RATIOSCALE_H

#include "link/modulation/Modulation.h"

namespace morvik::link {

/// Returns the soft value for a log-likelihood ratio of 1. Small scales round weak bits away, large ones clip strong
/// bits; the best compromise is measured (docs/scale.md). For algorithm type 2, only one scale is right
/// (DefaultScale.h).
///
/// codeRate    information bits for each bit sent so far, above 0
double ratioScale(int algorithmType, Modulation modulation, double codeRate);

}  // namespace morvik::link

#endif
