// BlockLayout: how the core processes a block of K bits, from the model's own components.
#include "BlockLayout.h"

#include <memory>
#include <stdexcept>

#include "rules/BlockSizes.h"
#include "src/TInterleaver.h"
#include "src/TNumberFormat.h"

namespace morvik {

namespace {

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
    const rules::BlockSize* const size = rules::findBlockSize(K);
    if (size == nullptr) {
        throw std::invalid_argument(std::to_string(K) + " is no block size of the LTE turbo code");
    }
    BlockLayout layout;
    layout.K = K;
    layout.f1 = size->f1;
    layout.f2 = size->f2;
    const std::unique_ptr<TInterleaver> interleaver(TInterleaver::create("3GPPLTE"));
    interleaver->calcInterleaver(layout.interleaver, K);
    for (const unsigned units : {2U, 4U, 8U}) {
        layout.cuts.emplace_back(K, units);
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
