// RatioScale: the default scale of log-likelihood ratios.
#include "RatioScale.h"

#include <array>

namespace morvik::link {

namespace {

/// The best scales at some rates; between them, the scale is a straight line.
constexpr std::array<double, 5> rates = {1.0 / 3, 0.5, 2.0 / 3, 0.8, 0.9};
constexpr std::array<std::array<double, rates.size()>, modulations.size()> scales = {{
    {6.5, 6, 5.2, 4.8, 4},      // BPSK
    {6.5, 6, 5.2, 4.8, 4},      // QPSK
    {6, 4.3, 3.3, 2.7, 2.4},    // 16QAM
    {4.8, 3.7, 2.3, 2.1, 2.4},  // 64QAM
    {4.4, 2.4, 2.3, 2, 2.4},    // 256QAM
}};

}  // namespace

double ratioScale(int algorithmType, Modulation modulation, double codeRate)
{
    if (algorithmType == 2) {
        return 4.5;  // 4 in theory; a little more suits ratios of the max-log demapper and costs others nothing
    }
    const auto& own = scales[static_cast<unsigned>(modulation)];
    if (codeRate <= rates.front()) {
        return own.front();
    }
    for (std::size_t i = 1; i < rates.size(); ++i) {
        if (codeRate < rates[i]) {
            return own[i - 1] + (own[i] - own[i - 1]) * ((codeRate - rates[i - 1]) / (rates[i] - rates[i - 1]));
        }
    }
    return own.back();
}

}  // namespace morvik::link
