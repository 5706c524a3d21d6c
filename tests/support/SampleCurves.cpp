// SampleCurves: synthetic error rates for the tests of plots and pages, with every feature that is drawn.
#include "SampleCurves.h"

#include <algorithm>
#include <cmath>

namespace morvik::support {

namespace {

/// A point whose confidence intervals follow from the number of block errors.
report::Sample sampleAt(double ebn0, std::uint64_t blocks, std::uint64_t blockErrors)
{
    constexpr double bitErrorsOfABlock = 30;
    constexpr double blockSize = 512;
    report::Sample sample;
    sample.ebn0 = ebn0;
    sample.blocks = blocks;
    sample.blockErrors = blockErrors;
    sample.bitErrors = static_cast<std::uint64_t>(bitErrorsOfABlock) * blockErrors;
    sample.berBelow = sample.blerBelow = blockErrors == 0;
    sample.bler = static_cast<double>(blockErrors) / static_cast<double>(blocks);
    const double spread = blockErrors == 0 ? 0 : std::exp(1.96 / std::sqrt(static_cast<double>(blockErrors)));
    sample.blerLow = blockErrors == 0 ? 0 : sample.bler / spread;
    sample.blerHigh = blockErrors == 0 ? 3.0 / static_cast<double>(blocks) : std::min(1.0, sample.bler * spread);
    sample.ber = sample.bler * bitErrorsOfABlock / blockSize;
    sample.berLow = sample.blerLow * bitErrorsOfABlock / blockSize;
    sample.berHigh = sample.blerHigh * bitErrorsOfABlock / blockSize;
    sample.clipped = 0.001 * std::exp(ebn0);
    return sample;
}

report::Curve curve(const std::string& title, double shift)
{
    report::Curve result;
    result.title = title;
    const std::vector<std::pair<std::uint64_t, std::uint64_t>> counts = {{320, 303},
                                                                         {384, 300},
                                                                         {624, 300},
                                                                         {1296, 301},
                                                                         {4224, 301},
                                                                         {25000, 300},
                                                                         {240000, 300},
                                                                         {600000, 57},
                                                                         {700000, 4}};
    double ebn0 = shift;
    for (const auto& [blocks, errors] : counts) {
        result.samples.push_back(sampleAt(ebn0, blocks, errors));
        ebn0 += 0.25;
    }
    result.samples.push_back(sampleAt(ebn0, 1000000, 0));
    return result;
}

report::Curve reference(const std::string& title)
{
    report::Curve result = curve(title, -0.1);
    result.reference = true;
    result.samples.pop_back();
    for (report::Sample& sample : result.samples) {
        sample.berLow = sample.berHigh = sample.blerLow = sample.blerHigh = sample.clipped = report::unknown;
    }
    return result;
}

}  // namespace

std::vector<report::Curve> sampleCurves()
{
    return {reference("K = 512, floating point"),
            curve("K = 512, 8 units, scaled, 8 iterations", 0),
            curve("K = 512, 8 units, max-log, 8 iterations", 0.15)};
}

std::vector<report::Curve> hostileCurves()
{
    return {reference("</script><script>console.error('script')</script>"),
            curve("<img src=x onerror=\"console.error('image')\"> & 'quoted' \\\" \x80 \x01", 0),
            curve("'; system 'touch injected' # `touch injected` $(touch injected) {/:Bold x}_1^2 @HOME %s", 0)};
}

std::vector<report::Curve> iterationCurves(unsigned iterations, const std::vector<double>& decibels)
{
    std::vector<report::Row> rows;
    for (unsigned i = 1; i <= iterations; ++i) {
        for (const double ebn0 : decibels) {
            const double errors = 10000 * std::exp(-0.5 * i * (ebn0 + 0.5));
            rows.push_back({{512, 8, "scaled", i, ""}, sampleAt(ebn0, 12000, static_cast<std::uint64_t>(errors))});
        }
    }
    return report::curvesOf(rows);
}

}  // namespace morvik::support
