// reference_fuzz: the reader of error rates to compare with takes any file.
#include <stdexcept>

#include "FuzzInput.h"
#include "TemporaryFiles.h"
#include "report/Reference.h"

namespace {

void requireSense(const morvik::report::Curve& curve)
{
    double last = -1000;
    for (const morvik::report::Sample& sample : curve.samples) {
        require(sample.ebn0 >= last && sample.ebn0 <= 1000, "points are in the order of Eb/N0");
        last = sample.ebn0;
        for (const double rate : {sample.ber,
                                  sample.berLow,
                                  sample.berHigh,
                                  sample.bler,
                                  sample.blerLow,
                                  sample.blerHigh,
                                  sample.clipped}) {
            require(!(rate < 0 || rate > 1), "a rate is 0 to 1, or not known");
        }
    }
}

}  // namespace

int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size)
{
    FuzzInput input(data, size);
    const char* const name = input.below(2) == 0 ? "in.csv" : "in.json";
    TemporaryFiles files;
    files.write(name, input.text());
    try {
        const auto curves = morvik::report::readReference(files.folder() + '/' + name);
        require(!curves.empty(), "a file that is taken has a curve");
        for (const morvik::report::Curve& curve : curves) {
            requireSense(curve);
        }
        morvik::report::againstIterations(curves);
    } catch (const std::runtime_error& error) {
        requireOneLine(error, files.folder() + '/' + name);
    }
    return 0;
}
