// morvik_lte_mex: what the functions morvik_lte_*.m call: the chain of include/morvik_link.h. Octave and MATLAB build
// it alike.
//
//     [status, text, ...] = morvik_lte_mex(command, ...)
//
// A block is a column. The callers have checked classes and sizes: bits are logical, ratios, symbols, soft buffers and
// gains single, integers and their soft buffers int16, all numbers whole and within 32 bits where they count
// something. They also raise errors, from the status of the C interface: an interpreter's functions for it would leave
// without destroying anything.
#include <mex.h>

#include <algorithm>
#include <array>
#include <cstddef>
#include <cstdint>
#include <cstring>
#include <exception>
#include <memory>
#include <vector>

#include "link/RatioScale.h"
#include "link/SymbolLink.h"
#include "morvik_link.h"
#include "rules/Tail.h"

namespace {

using morvik::rules::tailPositions;
constexpr std::size_t parityBits = 24;
constexpr std::uint32_t coreWidth = 8;

/// The elements; of an empty array, a place that nobody looks at, as the library wants no null pointers.
template <class Value>
Value* data(const mxArray* array)
{
    static double none = 0;
    void* const elements = mxGetData(array);
    return static_cast<Value*>(elements != nullptr ? elements : &none);
}

std::uint8_t* bits(const mxArray* array)
{
    return data<std::uint8_t>(array);
}

/// A whole number of a vector of doubles.
std::uint32_t whole(const mxArray* numbers, std::size_t index = 0)
{
    return static_cast<std::uint32_t>(data<const double>(numbers)[index]);
}

float real(const mxArray* number)
{
    return static_cast<float>(*data<const double>(number));
}

mxArray* logicalMatrix(std::size_t rows, std::size_t columns)
{
    return mxCreateLogicalMatrix(static_cast<mwSize>(rows), static_cast<mwSize>(columns));
}

mxArray* numericMatrix(std::size_t rows, std::size_t columns, mxClassID type)
{
    return mxCreateNumericMatrix(static_cast<mwSize>(rows), static_cast<mwSize>(columns), type, mxREAL);
}

/// Whether these are integers, not floats.
bool areSteps(const mxArray* values)
{
    return mxGetClassID(values) == mxINT16_CLASS;
}

/// What earlier transmissions left, or zeros, of the class of what is added to them.
mxArray* buffersBefore(const mxArray* left, std::size_t size, const mxArray* added)
{
    return mxIsEmpty(left) ? numericMatrix(size, mxGetN(added), mxGetClassID(added)) : mxDuplicateArray(left);
}

using Results = mxArray**;
using Arguments = const mxArray* const*;

// ---- Steps

/// bits, whether with gCRC24B -> parity
std::int32_t crc(Results results, Arguments arguments)
{
    const std::size_t count = mxGetM(arguments[0]);
    const std::size_t blocks = mxGetN(arguments[0]);
    const auto function = whole(arguments[1]) != 0 ? morvik_link_crc24b : morvik_link_crc24a;
    results[0] = logicalMatrix(parityBits, blocks);
    for (std::size_t b = 0; b < blocks; ++b) {
        function(bits(arguments[0]) + b * count, count, bits(results[0]) + b * parityBits);
    }
    return MORVIK_LINK_OK;
}

/// transport block size -> count, fillers, size_plus, count_plus, size_minus, count_minus
std::int32_t segment(Results results, Arguments arguments)
{
    morvik_link_code_blocks blocks{};
    const std::int32_t status = morvik_link_segment(whole(arguments[0]), &blocks);
    const std::array numbers = {
        blocks.count, blocks.fillers, blocks.size_plus, blocks.count_plus, blocks.size_minus, blocks.count_minus};
    results[0] = numericMatrix(1, numbers.size(), mxDOUBLE_CLASS);
    std::copy(numbers.begin(), numbers.end(), data<double>(results[0]));
    return status;
}

/// Rate matching of code blocks is described by K, filler bits, positions of the circular buffer, redundancy version.
struct Matching {
    explicit Matching(const mxArray* numbers)
        : K(whole(numbers)), fillers(whole(numbers, 1)), size(whole(numbers, 2)), version(whole(numbers, 3))
    {
    }

    std::uint32_t K;
    std::uint32_t fillers;
    std::uint32_t size;
    std::uint32_t version;
};

/// matching, sys, par1, par2, count -> coded bits
std::int32_t rateMatch(Results results, Arguments arguments)
{
    const Matching of(arguments[0]);
    const std::size_t blocks = mxGetN(arguments[1]);
    const std::size_t count = whole(arguments[4]);
    results[0] = logicalMatrix(count, blocks);
    return morvik_link_rate_match(of.K,
                                  of.fillers,
                                  of.size,
                                  of.version,
                                  blocks,
                                  bits(arguments[1]),
                                  bits(arguments[2]),
                                  bits(arguments[3]),
                                  count,
                                  bits(results[0]));
}

/// matching, ratios or steps, soft buffers or nothing, width of steps -> soft buffers
std::int32_t rateRecover(Results results, Arguments arguments)
{
    const Matching of(arguments[0]);
    const mxArray* const received = arguments[1];
    const std::size_t blocks = mxGetN(received);
    const std::size_t count = mxGetM(received);
    std::uint32_t size = 0;
    const std::int32_t status = morvik_link_soft_buffer_size(of.K, of.fillers, of.size, &size);
    results[0] = buffersBefore(arguments[2], size, received);
    if (status != MORVIK_LINK_OK) {
        return status;
    }
    return areSteps(received) ? morvik_link_rate_recover_i16(of.K,
                                                             of.fillers,
                                                             of.size,
                                                             of.version,
                                                             blocks,
                                                             data<const std::int16_t>(received),
                                                             count,
                                                             whole(arguments[3]),
                                                             data<std::int16_t>(results[0]))
                              : morvik_link_rate_recover(of.K,
                                                         of.fillers,
                                                         of.size,
                                                         of.version,
                                                         blocks,
                                                         data<const float>(received),
                                                         count,
                                                         data<float>(results[0]));
}

/// matching -> values of a soft buffer
std::int32_t bufferSize(Results results, Arguments arguments)
{
    const Matching of(arguments[0]);
    std::uint32_t size = 0;
    const std::int32_t status = morvik_link_soft_buffer_size(of.K, of.fillers, of.size, &size);
    results[0] = mxCreateDoubleScalar(size);
    return status;
}

template <class Value, class Function>
std::int32_t deinterleaveBy(Function function, Results results, Arguments arguments)
{
    const Matching of(arguments[0]);
    const std::size_t blocks = mxGetN(arguments[1]);
    for (std::size_t s = 0; s < 3; ++s) {
        results[s] = numericMatrix(of.K + tailPositions, blocks, mxGetClassID(arguments[1]));
    }
    return function(of.K,
                    of.fillers,
                    of.size,
                    blocks,
                    data<const Value>(arguments[1]),
                    static_cast<Value>(*data<const double>(arguments[2])),
                    data<Value>(results[0]),
                    data<Value>(results[1]),
                    data<Value>(results[2]));
}

/// matching, soft buffers or their soft values, filler -> sys, par1, par2 of the same class
std::int32_t deinterleave(Results results, Arguments arguments)
{
    return mxGetClassID(arguments[1]) == mxINT8_CLASS
               ? deinterleaveBy<std::int8_t>(morvik_link_deinterleave_i8, results, arguments)
               : deinterleaveBy<float>(morvik_link_deinterleave, results, arguments);
}

/// ratios, scale, width -> soft values of the core where width is 8, else steps
std::int32_t softValues(Results results, Arguments arguments)
{
    const auto* const ratios = data<const float>(arguments[0]);
    const std::size_t count = mxGetNumberOfElements(arguments[0]);
    const std::uint32_t width = whole(arguments[2]);
    results[0] =
        numericMatrix(mxGetM(arguments[0]), mxGetN(arguments[0]), width == coreWidth ? mxINT8_CLASS : mxINT16_CLASS);
    return width == coreWidth
               ? morvik_link_soft_values(ratios, count, real(arguments[1]), data<std::int8_t>(results[0]))
               : morvik_link_soft_values_i16(ratios, count, real(arguments[1]), width, data<std::int16_t>(results[0]));
}

/// algorithm, bits per symbol, code rate -> scale
std::int32_t ratioScale(Results results, Arguments arguments)
{
    const auto modulation = morvik::link::modulations[whole(arguments[1]) / 2];
    const auto algorithm = static_cast<int>(whole(arguments[0]));
    results[0] =
        mxCreateDoubleScalar(morvik::link::ratioScale(algorithm, modulation, *data<const double>(arguments[2])));
    return MORVIK_LINK_OK;
}

// ---- Modulation: a symbol is two rows, I and Q, or one for BPSK

/// bits per symbol, bits -> symbols
std::int32_t map(Results results, Arguments arguments)
{
    const std::uint32_t perSymbol = whole(arguments[0]);
    const std::size_t count = mxGetM(arguments[1]) / perSymbol;
    results[0] = numericMatrix(perSymbol == 1 ? count : 2 * count, mxGetN(arguments[1]), mxSINGLE_CLASS);
    return morvik_link_map(perSymbol, bits(arguments[1]), count * mxGetN(arguments[1]), data<float>(results[0]));
}

/// bits per symbol, demapper, symbols, gains or nothing, noise variance -> ratios
std::int32_t demap(Results results, Arguments arguments)
{
    const std::uint32_t perSymbol = whole(arguments[0]);
    const std::size_t count = mxGetM(arguments[2]) / (perSymbol == 1 ? 1 : 2);
    const std::size_t blocks = mxGetN(arguments[2]);
    results[0] = numericMatrix(count * perSymbol, blocks, mxSINGLE_CLASS);
    return morvik_link_demap(perSymbol,
                             static_cast<std::int32_t>(whole(arguments[1])),
                             data<const float>(arguments[2]),
                             mxIsEmpty(arguments[3]) ? nullptr : data<const float>(arguments[3]),
                             real(arguments[4]),
                             count * blocks,
                             data<float>(results[0]));
}

/// bits per symbol, fading, demapper, thousandths of a decibel, seed, bits -> ratios
std::int32_t transmit(Results results, Arguments arguments)
{
    using namespace morvik::link;
    const SymbolFormat format{modulations[whole(arguments[0]) / 2],
                              fadings[whole(arguments[1])],
                              demappers[whole(arguments[2])],
                              static_cast<int>(*data<const double>(arguments[3]))};
    const auto seed = static_cast<std::uint64_t>(*data<const double>(arguments[4]));
    const std::size_t count = mxGetM(arguments[5]);
    const std::size_t blocks = mxGetN(arguments[5]);
    results[0] = numericMatrix(count, blocks, mxSINGLE_CLASS);
    transmitRows(format, seed, bits(arguments[5]), blocks, count, data<float>(results[0]));
    return MORVIK_LINK_OK;
}

// ---- Transport blocks: a format is five numbers, in the order of morvik_link_format

struct Destroy {
    void operator()(morvik_link_transport* transport) const
    {
        morvik_link_transport_destroy(transport);
    }
};
using Transport = std::unique_ptr<morvik_link_transport, Destroy>;

morvik_link_format formatOf(const mxArray* numbers)
{
    return {whole(numbers), whole(numbers, 1), whole(numbers, 2), whole(numbers, 3), whole(numbers, 4)};
}

std::int32_t make(const mxArray* numbers, Transport& made)
{
    const morvik_link_format format = formatOf(numbers);
    morvik_link_transport* transport = nullptr;
    const std::int32_t status = morvik_link_transport_create(&format, &transport);
    made.reset(transport);
    return status;
}

morvik_link_places placesOf(const Transport& transport, std::uint32_t r)
{
    morvik_link_places places{};
    morvik_link_transport_code_block(transport.get(), r, &places);
    return places;
}

/// format, version, bits -> coded bits
std::int32_t encode(Results results, Arguments arguments)
{
    Transport transport;
    const std::int32_t status = make(arguments[0], transport);
    const std::size_t blocks = mxGetN(arguments[2]);
    results[0] = logicalMatrix(formatOf(arguments[0]).coded_bits, blocks);
    return status != MORVIK_LINK_OK
               ? status
               : morvik_link_transport_encode(
                     transport.get(), whole(arguments[1]), blocks, bits(arguments[2]), bits(results[0]));
}

/// format, version, ratios or steps, soft buffers or nothing, width of steps -> soft buffers
std::int32_t recover(Results results, Arguments arguments)
{
    Transport transport;
    const std::int32_t status = make(arguments[0], transport);
    const std::uint32_t version = whole(arguments[1]);
    const mxArray* const received = arguments[2];
    const std::size_t blocks = mxGetN(received);
    results[0] = buffersBefore(arguments[3], morvik_link_transport_buffer_size(transport.get()), received);
    if (status != MORVIK_LINK_OK) {
        return status;
    }
    return areSteps(received)
               ? morvik_link_transport_recover_i16(transport.get(),
                                                   version,
                                                   blocks,
                                                   data<const std::int16_t>(received),
                                                   whole(arguments[4]),
                                                   data<std::int16_t>(results[0]))
               : morvik_link_transport_recover(
                     transport.get(), version, blocks, data<const float>(received), data<float>(results[0]));
}

/// format -> values of a soft buffer
std::int32_t transportBuffer(Results results, Arguments arguments)
{
    Transport transport;
    const std::int32_t status = make(arguments[0], transport);
    results[0] = mxCreateDoubleScalar(morvik_link_transport_buffer_size(transport.get()));
    return status;
}

/// format -> a column for each code block, with the members of morvik_link_places; places are counted from 1
std::int32_t codeBlocks(Results results, Arguments arguments)
{
    Transport transport;
    morvik_link_code_blocks blocks{};
    const std::int32_t status = make(arguments[0], transport);
    morvik_link_segment(formatOf(arguments[0]).transport_block_size, &blocks);
    results[0] = numericMatrix(8, blocks.count, mxDOUBLE_CLASS);
    double* to = data<double>(results[0]);
    for (std::uint32_t r = 0; r < blocks.count && status == MORVIK_LINK_OK; ++r) {
        const morvik_link_places places = placesOf(transport, r);
        for (const std::uint32_t number : {places.size,
                                           places.fillers,
                                           places.payload,
                                           places.payload_at + 1,
                                           places.coded_bits,
                                           places.coded_at + 1,
                                           places.buffer_size,
                                           places.buffer_at + 1}) {
            *to++ = number;
        }
    }
    return status;
}

/// format, number of a code block, soft buffers of ratios or of steps, scale of ratios -> sys, par1, par2
std::int32_t blockValues(Results results, Arguments arguments)
{
    Transport transport;
    const std::int32_t status = make(arguments[0], transport);
    const std::uint32_t r = whole(arguments[1]);
    const std::size_t blocks = mxGetN(arguments[2]);
    for (std::size_t s = 0; s < 3; ++s) {
        results[s] = numericMatrix(placesOf(transport, r).size + tailPositions, blocks, mxINT8_CLASS);
    }
    if (status != MORVIK_LINK_OK) {
        return status;
    }
    auto* const sys = data<std::int8_t>(results[0]);
    auto* const par1 = data<std::int8_t>(results[1]);
    auto* const par2 = data<std::int8_t>(results[2]);
    return areSteps(arguments[2])
               ? morvik_link_transport_soft_values_i16(
                     transport.get(), r, blocks, data<const std::int16_t>(arguments[2]), sys, par1, par2)
               : morvik_link_transport_soft_values(
                     transport.get(), r, blocks, data<const float>(arguments[2]), real(arguments[3]), sys, par1, par2);
}

/// format, cell of the decisions on each code block -> bits, whether all CRCs fit, whether each code block's fits
std::int32_t join(Results results, Arguments arguments)
{
    Transport transport;
    std::int32_t status = make(arguments[0], transport);
    const std::size_t count = mxGetNumberOfElements(arguments[1]);
    const std::size_t blocks = mxGetN(mxGetCell(arguments[1], 0));
    const std::size_t size = formatOf(arguments[0]).transport_block_size;
    results[0] = logicalMatrix(size, blocks);
    results[1] = logicalMatrix(1, blocks);
    results[2] = logicalMatrix(count, blocks);
    std::vector<std::uint8_t> joined(blocks * (size + parityBits));
    std::vector<std::uint8_t> fits(blocks);
    for (std::size_t r = 0; r < count && status == MORVIK_LINK_OK; ++r) {
        status = morvik_link_transport_join(transport.get(),
                                            static_cast<std::uint32_t>(r),
                                            blocks,
                                            bits(mxGetCell(arguments[1], static_cast<mwIndex>(r))),
                                            joined.data(),
                                            fits.data());
        for (std::size_t b = 0; b < blocks; ++b) {
            bits(results[2])[b * count + r] = fits[b];
        }
    }
    if (status == MORVIK_LINK_OK) {
        status = morvik_link_transport_check(transport.get(), blocks, joined.data(), bits(results[1]));
    }
    for (std::size_t b = 0; b < blocks; ++b) {
        std::memcpy(bits(results[0]) + b * size, joined.data() + b * (size + parityBits), size);
        for (std::size_t r = 0; r < count; ++r) {
            bits(results[1])[b] &= bits(results[2])[b * count + r];
        }
    }
    return status;
}

struct Command {
    const char* name;
    std::int32_t (*run)(Results results, Arguments arguments);
};

constexpr std::array<Command, 17> commands = {{{"crc", crc},
                                               {"segment", segment},
                                               {"rate_match", rateMatch},
                                               {"rate_recover", rateRecover},
                                               {"buffer_size", bufferSize},
                                               {"deinterleave", deinterleave},
                                               {"soft_values", softValues},
                                               {"ratio_scale", ratioScale},
                                               {"map", map},
                                               {"demap", demap},
                                               {"transmit", transmit},
                                               {"encode", encode},
                                               {"recover", recover},
                                               {"transport_buffer", transportBuffer},
                                               {"code_blocks", codeBlocks},
                                               {"block_values", blockValues},
                                               {"join", join}}};

}  // namespace

void mexFunction(int, mxArray* plhs[], int, const mxArray* prhs[])
{
    std::int32_t status = MORVIK_LINK_OUT_OF_MEMORY;
    try {
        std::array<char, 20> name{};
        mxGetString(prhs[0], name.data(), static_cast<mwSize>(name.size()));
        for (const Command& command : commands) {
            if (std::strcmp(command.name, name.data()) == 0) {
                status = command.run(plhs + 2, prhs + 1);
            }
        }
    } catch (const std::exception&) {
        status = MORVIK_LINK_OUT_OF_MEMORY;
    }
    plhs[0] = mxCreateDoubleScalar(status);
    plhs[1] = mxCreateString(morvik_link_status_text(status));
}
