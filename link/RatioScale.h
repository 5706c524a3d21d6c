// RatioScale: the default scale of log-likelihood ratios.
#ifndef MORVIK_LINK_RATIOSCALE_H
#define MORVIK_LINK_RATIOSCALE_H

#include "link/modulation/Modulation.h"

namespace morvik::link {

/// Steps of a soft value for a log-likelihood ratio of 1. The ratios of high rates and of many levels need finer steps
/// than those of low rates, but reach further; the best compromise is measured (docs/scale.md). Algorithm type 2 is
/// right for one scale only, as DefaultScale.h tells.
///
/// codeRate    information bits for each bit sent so far, above 0
double ratioScale(int algorithmType, Modulation modulation, double codeRate);

}  // namespace morvik::link

#endif
