// Model: every value that the core computes on a block, and how it cuts the block.
#include "Model.h"

#include <cstddef>
#include <sstream>
#include <utility>

#include "src/TDecoder3GPU.h"

namespace morvik::comparison {

Model computeModel(const SoftBlock& block,
                   const veltra_ip_morvik_v1_0_generics& generics,
                   unsigned iterations,
                   std::ostream& warnings)
{
    Passes passes(block, generics, warnings);
    Values values(rules::halfIterations(iterations), passes.cut().K() + rules::tailSteps);
    for (unsigned pass = 0; pass < values.passes(); ++pass) {
        passes.next();
        for (unsigned signal = 0; signal < signalCount; ++signal) {
            passes.copyValues(signal, values.row(pass, signal));
        }
    }
    const TDecoder3GPU& core = passes.component();
    return {generics,
            std::move(values),
            passes.cut(),
            {{{core.itsSys[0], core.itsPar0[0], core.itsInterleaver->itsPiInv},
              {core.itsSys[1], core.itsPar0[1], core.itsInterleaver->itsPi}}}};
}

bool computesAll(const SoftBlock& block, const veltra_ip_morvik_v1_0_generics& generics, const Values& dump)
{
    std::ostringstream warnings;
    Passes passes(block, generics, warnings);
    for (unsigned pass = 0; pass < dump.passes(); ++pass) {
        passes.next();
        for (unsigned signal = 0; signal < signalCount; ++signal) {
            for (unsigned step = 0; step < dump.steps(); ++step) {
                const Place place = {pass, signal, step};
                if (dump.has(place) && passes.isComputed(signal, step) &&
                    dump.at(place) != passes.value(signal, step)) {
                    return false;
                }
            }
        }
    }
    return true;
}

std::vector<unsigned> stepsInOrder(const rules::Cut& cut, Stage stage)
{
    std::vector<unsigned> steps;
    if (stage == Stage::backward) {
        for (unsigned row = 0; row < cut.rows(); ++row) {
            for (unsigned back = 1; back <= cut.windowLength(row); ++back) {
                for (unsigned u = 0; u < cut.segments(); ++u) {
                    steps.push_back(u * cut.segmentLength() + cut.windowStart(row + 1) - back);
                }
            }
        }
        return steps;
    }
    for (unsigned time = 0; time < cut.segmentLength(); ++time) {
        for (unsigned u = 0; u < cut.segments(); ++u) {
            steps.push_back(u * cut.segmentLength() + time);
        }
    }
    for (unsigned step = 0; step < stepsAfterBits(stage); ++step) {
        steps.push_back(cut.K() + step);
    }
    return steps;
}

}  // namespace morvik::comparison
