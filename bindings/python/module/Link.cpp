// Link: encoder, interleaver and channel of the package, for plain code blocks.
#include "Link.h"

#include <pybind11/stl.h>

#include <algorithm>
#include <array>
#include <cstdint>
#include <vector>

#include "Arrays.h"
#include "link/FrameSource.h"
#include "link/channel/Channel.h"
#include "link/channel/DefaultScale.h"
#include "link/channel/SoftValueSampler.h"
#include "link/coding/PackedBits.h"
#include "link/coding/TurboEncoder.h"
#include "link/random/Random.h"
#include "link/random/SamplerForm.h"
#include "rules/BlockSizes.h"
#include "rules/Interleaver.h"
#include "rules/Tail.h"

namespace py = pybind11;

namespace morvik::python {

namespace {

using namespace morvik::link;

Array<std::int64_t> interleaver(unsigned K)
{
    rules::InterleaverAddress address(*rules::findBlockSize(K));
    Array<std::int64_t> positions(static_cast<py::ssize_t>(K));
    for (unsigned i = 0; i < K; ++i) {
        positions.mutable_data()[i] = address.next();
    }
    return positions;
}

/// Encodes blocks of K bits, each 0 or 1, into the three streams of K + 4.
py::tuple encode(const Array<std::uint8_t>& bits)
{
    const std::size_t blocks = sizeOf(bits.shape(0));
    const std::size_t K = sizeOf(bits.shape(1));
    std::array<Array<std::uint8_t>, 3> streams;
    std::array<std::uint8_t*, 3> to{};
    for (std::size_t s = 0; s < streams.size(); ++s) {
        streams[s] = Array<std::uint8_t>({bits.shape(0), bits.shape(1) + rules::tailPositions});
        to[s] = streams[s].mutable_data();
    }
    const std::uint8_t* from = bits.data();
    {
        const Unlocked unlocked;
        TurboEncoder encoder(static_cast<unsigned>(K));
        PackedBlocks information{encoder.words(), {}};
        TurboEncoder::Streams encoded;
        for (std::size_t done = 0; done < blocks; done += TurboEncoder::blocksAtOnce) {
            const auto now = static_cast<unsigned>(std::min<std::size_t>(blocks - done, TurboEncoder::blocksAtOnce));
            information.bits.resize(std::size_t{now} * information.words);
            for (unsigned b = 0; b < now; ++b) {
                packBits(from + (done + b) * K, K, information.block(b));
            }
            encoder.encode(information, now, encoded);
            for (std::size_t s = 0; s < streams.size(); ++s) {
                for (unsigned b = 0; b < now; ++b) {
                    unpackBits(
                        encoded[s].block(b), K + rules::tailPositions, to[s] + (done + b) * (K + rules::tailPositions));
                }
            }
        }
    }
    return py::make_tuple(streams[0], streams[1], streams[2]);
}

/// Draws the soft values of encoded blocks over BPSK with Gaussian noise: those of frames 0 and up of a simulation with
/// this seed.
py::tuple transmit(const std::array<Array<std::uint8_t>, 3>& streams,
                   int milliDecibels,
                   double scale,
                   std::uint64_t seed)
{
    const std::size_t blocks = sizeOf(streams[0].shape(0));
    const std::size_t positions = sizeOf(streams[0].shape(1));
    const auto K = static_cast<unsigned>(positions) - rules::tailPositions;
    std::array<Array<std::int8_t>, 3> received;
    std::array<const std::uint8_t*, 3> from{};
    std::array<std::int8_t*, 3> to{};
    for (std::size_t s = 0; s < streams.size(); ++s) {
        received[s] = Array<std::int8_t>({streams[s].shape(0), streams[s].shape(1)});
        from[s] = streams[s].data();
        to[s] = received[s].mutable_data();
    }
    {
        const Unlocked unlocked;
        const RandomKey key = randomKey(seed);
        SoftValueSampler sampler(
            roundedDistribution(noiseDeviation(K, milliDecibels), scale), key, samplerForms().front());
        std::vector<std::uint64_t> bits(wordsOf(positions));
        std::uint32_t clipped = 0;
        for (std::size_t b = 0; b < blocks; ++b) {
            const FrameRandom random(key, K, milliDecibels, b);
            for (std::size_t s = 0; s < streams.size(); ++s) {
                packBits(from[s] + b * positions, positions, bits.data());
                sampler.put(random,
                            static_cast<std::uint32_t>(s) * FrameSource::streamStride,
                            bits.data(),
                            static_cast<unsigned>(positions),
                            to[s] + b * positions,
                            clipped);
            }
            if (sampler.size() >= FrameSource::groupsAtOnce) {
                sampler.draw();
            }
        }
        sampler.draw();
    }
    return py::make_tuple(received[0], received[1], received[2]);
}

}  // namespace

void addLink(py::module_& module)
{
    py::tuple sizes(rules::blockSizes.size());
    for (std::size_t i = 0; i < rules::blockSizes.size(); ++i) {
        sizes[i] = rules::blockSizes[i].K;
    }
    module.attr("block_sizes") = sizes;
    module.def("interleaver", interleaver, py::arg("block_size"));
    module.def("encode", encode, py::arg("bits").noconvert());
    module.def("transmit", transmit, py::arg("streams"), py::arg("milli_decibels"), py::arg("scale"), py::arg("seed"));
    module.def("default_scale", defaultScale, py::arg("algorithm"), py::arg("block_size"), py::arg("milli_decibels"));
}

}  // namespace morvik::python
