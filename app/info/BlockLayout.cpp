// BlockLayout: how the core works on a block of K bits, as the model's own components tell it.
#include "BlockLayout.h"

#include <memory>
#include <stdexcept>

#include "TDecoder3GPU.h"
#include "TInterleaver.h"
#include "TNumberFormat.h"
#include "rules/BlockSizes.h"

namespace morvik {

namespace {

UnitLayout divided(std::uint32_t K, int numPu)
{
    const std::unique_ptr<TDecoder> made(TDecoder::create("3GPPPU:" + std::to_string(numPu)));
    auto* const decoder = dynamic_cast<TDecoder3GPU*>(made.get());
    if (decoder == nullptr || !decoder->allocate(K + tailSteps)) {
        throw std::runtime_error("the decoder does not divide blocks of " + std::to_string(K) + " bits");
    }
    const Division division(*decoder);
    UnitLayout layout;
    layout.numPu = numPu;
    layout.threads = decoder->itsNumPU * decoder->itsThreadsPerPU;
    layout.segments = division.segments();
    layout.segmentLength = division.segmentLength();
    layout.windows = division.windows();
    for (const Window& window : layout.windows) {
        if (window.segment == 0) {
            layout.lengths.push_back(window.last - window.first + 1);
        }
    }
    return layout;
}

NumberFormat formatOf(const std::string& what, const std::string& text)
{
    const std::unique_ptr<TNumberFormat> format(TNumberFormat::create(text));
    return {what,
            text,
            format->itsNBits,
            format->itsBinPt,
            static_cast<double>(format->itsMinQ) / format->itsScale,
            static_cast<double>(format->itsMaxQ) / format->itsScale};
}

}  // namespace

BlockLayout layoutOf(std::uint32_t K)
{
    const standard::BlockSize* const size = standard::findBlockSize(K);
    if (size == nullptr) {
        throw std::invalid_argument(std::to_string(K) + " is no block size of the LTE turbo code");
    }
    BlockLayout layout;
    layout.K = K;
    layout.f1 = size->f1;
    layout.f2 = size->f2;
    const std::unique_ptr<TInterleaver> interleaver(TInterleaver::create("3GPPLTE"));
    interleaver->calcInterleaver(layout.interleaver, K);
    for (const int numPu : {2, 4, 8}) {
        layout.divisions.push_back(divided(K, numPu));
    }
    return layout;
}

std::vector<NumberFormat> numberFormats()
{
    return {formatOf("soft inputs", "Fix_8_3"),
            formatOf("branch metrics", "Fix_8_3"),
            formatOf("state metrics and ratios", "Fix_12_3")};
}

}  // namespace morvik
