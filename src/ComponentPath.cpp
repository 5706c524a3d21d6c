// ComponentPath: decodes blocks with the state's components, one at a time.
#include "ComponentPath.h"

#include <algorithm>
#include <cstddef>
#include <cstring>

#include "CoreInputs.h"
#include "PathChoice.h"

using morvik::simulation_call::Status;

namespace {

/// Brings the metric columns up to date with all earlier blocks, then calls decode(decoder) and returns its status.
template <class Decode>
Status decodeWith(veltra_ip_morvik_v1_0_state& state, Decode decode)
{
    return morvik::simulation_call::guarded([&] {
        if (state.path_choice != nullptr) {
            state.path_choice->catchUp();
        }
        return decode(*state.decoder) ? morvik::simulation_call::success : morvik::simulation_call::decodeFailed;
    });
}

}  // namespace

unsigned ComponentPath::take(const morvik::simulation_call::Batch& batch, std::size_t first, unsigned)
{
    itsBlockSize = batch.blockSize();
    itsSoft.clear();
    itsSoft.reserve(3 * static_cast<std::size_t>(batch.dinSize));
    morvik::core_inputs::forEachSoftValue(itsState, batch, first, [&](unsigned, std::int32_t, std::int32_t integer) {
        itsSoft.push_back(itsState.state_format->place(integer));
    });
    return 1;
}

Status ComponentPath::decode(unsigned iterations)
{
    return decodeWith(itsState, [&](TDecoder& decoder) { return decoder.decode(itsSoft, itsHard, iterations); });
}

Status ComponentPath::countErrors(unsigned iterations, const std::uint8_t* sent, std::uint32_t* errors)
{
    const std::vector<unsigned char> reference(sent, sent + itsBlockSize);
    std::vector<unsigned long long> bitErrors(iterations);
    std::vector<unsigned long long> blockErrors;
    const Status status = decodeWith(
        itsState, [&](TDecoder& decoder) { return decoder.decode(itsSoft, reference, bitErrors, blockErrors); });
    for (std::size_t t = 0; status == morvik::simulation_call::success && t < iterations; ++t) {
        morvik::lanes::setValueAt(errors, t, static_cast<std::uint32_t>(bitErrors[t]));
    }
    return status;
}

std::size_t ComponentPath::blockSize() const
{
    return itsHard.size();
}

void ComponentPath::decisions(std::uint8_t* to)
{
    std::copy(itsHard.begin(), itsHard.end(), to);
}

void ComponentPath::ratios(std::int16_t* to)
{
    std::memcpy(to, itsState.decoder->itsLLR.data(), itsHard.size() * sizeof *to);
}
