// Lte: the chain of include/morvik_link.h on NumPy arrays. Arrays are rows of blocks; their shapes fit each other.
#include "Lte.h"

#include <pybind11/stl.h>

#include <array>
#include <cstdint>
#include <memory>
#include <optional>
#include <string>
#include <type_traits>
#include <vector>

#include "Arrays.h"
#include "Decoder.h"
#include "link/RatioScale.h"
#include "link/SymbolLink.h"
#include "morvik_link.h"
#include "rules/Tail.h"

namespace py = pybind11;

namespace morvik::python {

namespace {

template <class Element>
using Streams = std::array<Array<Element>, 3>;

/// Throws what the status says, unless it is none.
void expect(std::int32_t status)
{
    if (status == MORVIK_LINK_OUT_OF_MEMORY) {
        throw std::bad_alloc();
    }
    if (status != MORVIK_LINK_OK) {
        throw Refusal(morvik_link_status_text(status));
    }
}

/// Makes the call without the interpreter lock.
template <class Call>
void run(Call call)
{
    std::int32_t status = MORVIK_LINK_OK;
    {
        const Unlocked unlocked;
        status = call();
    }
    expect(status);
}

template <class Element>
std::size_t rows(const Array<Element>& array)
{
    return sizeOf(array.shape(0));
}

template <class Element>
std::size_t columns(const Array<Element>& array)
{
    return sizeOf(array.shape(1));
}

template <class Element>
Array<Element> matrix(std::size_t height, std::size_t width)
{
    return Array<Element>({static_cast<py::ssize_t>(height), static_cast<py::ssize_t>(width)});
}

template <class Element>
Streams<Element> streamsOf(std::size_t blocks, std::uint32_t K)
{
    const std::size_t positions = K + rules::tailPositions;
    return {matrix<Element>(blocks, positions), matrix<Element>(blocks, positions), matrix<Element>(blocks, positions)};
}

// ---- Single stages

Array<std::uint8_t> crc(const Array<std::uint8_t>& bits, bool isOfCodeBlock)
{
    constexpr std::size_t parityBits = 24;
    Array<std::uint8_t> parity = matrix<std::uint8_t>(rows(bits), parityBits);
    const std::size_t count = columns(bits);
    const auto function = isOfCodeBlock ? morvik_link_crc24b : morvik_link_crc24a;
    for (std::size_t b = 0; b < rows(bits); ++b) {
        expect(function(bits.data() + b * count, count, parity.mutable_data() + b * parityBits));
    }
    return parity;
}

py::tuple segment(std::uint32_t transportBlockSize)
{
    morvik_link_code_blocks blocks;
    expect(morvik_link_segment(transportBlockSize, &blocks));
    return py::make_tuple(
        blocks.count, blocks.fillers, blocks.size_plus, blocks.count_plus, blocks.size_minus, blocks.count_minus);
}

/// A code block's rate matching: K, filler bits, positions of its circular buffer.
using Matching = std::array<std::uint32_t, 3>;

Array<std::uint8_t> rateMatch(const Matching& matching,
                              std::uint32_t version,
                              const Streams<std::uint8_t>& streams,
                              std::size_t count)
{
    const auto& [K, fillers, size] = matching;
    Array<std::uint8_t> coded = matrix<std::uint8_t>(rows(streams[0]), count);
    expect(morvik_link_rate_match(K,
                                  fillers,
                                  size,
                                  version,
                                  rows(streams[0]),
                                  streams[0].data(),
                                  streams[1].data(),
                                  streams[2].data(),
                                  count,
                                  coded.mutable_data()));
    return coded;
}

std::uint32_t softBufferSize(const Matching& matching)
{
    std::uint32_t size = 0;
    expect(morvik_link_soft_buffer_size(matching[0], matching[1], matching[2], &size));
    return size;
}

void rateRecover(const Matching& matching, std::uint32_t version, const Array<float>& ratios, Array<float>& buffers)
{
    expect(morvik_link_rate_recover(matching[0],
                                    matching[1],
                                    matching[2],
                                    version,
                                    rows(ratios),
                                    ratios.data(),
                                    columns(ratios),
                                    buffers.mutable_data()));
}

void rateRecoverIntegers(const Matching& matching,
                         std::uint32_t version,
                         const Array<std::int16_t>& ratios,
                         std::uint32_t width,
                         Array<std::int16_t>& buffers)
{
    expect(morvik_link_rate_recover_i16(matching[0],
                                        matching[1],
                                        matching[2],
                                        version,
                                        rows(ratios),
                                        ratios.data(),
                                        columns(ratios),
                                        width,
                                        buffers.mutable_data()));
}

template <class Element>
Streams<Element> deinterleave(const Matching& matching, const Array<Element>& buffers, Element filler)
{
    const auto& [K, fillers, size] = matching;
    Streams<Element> streams = streamsOf<Element>(rows(buffers), K);
    if constexpr (std::is_same_v<Element, float>) {
        expect(morvik_link_deinterleave(K,
                                        fillers,
                                        size,
                                        rows(buffers),
                                        buffers.data(),
                                        filler,
                                        streams[0].mutable_data(),
                                        streams[1].mutable_data(),
                                        streams[2].mutable_data()));
    } else {
        expect(morvik_link_deinterleave_i8(K,
                                           fillers,
                                           size,
                                           rows(buffers),
                                           buffers.data(),
                                           filler,
                                           streams[0].mutable_data(),
                                           streams[1].mutable_data(),
                                           streams[2].mutable_data()));
    }
    return streams;
}

Array<std::int8_t> softValues(const Array<float>& ratios, float scale)
{
    Array<std::int8_t> values(ratios.size());
    run([&, to = values.mutable_data()] {
        return morvik_link_soft_values(ratios.data(), sizeOf(ratios.size()), scale, to);
    });
    return values;
}

Array<std::int16_t> softIntegers(const Array<float>& ratios, float scale, std::uint32_t width)
{
    Array<std::int16_t> values(ratios.size());
    run([&, to = values.mutable_data()] {
        return morvik_link_soft_values_i16(ratios.data(), sizeOf(ratios.size()), scale, width, to);
    });
    return values;
}

// ---- Modulation

/// One number of each symbol for BPSK, two for all others.
Array<float> map(std::uint32_t bitsPerSymbol, const Array<std::uint8_t>& bits)
{
    const std::size_t count = sizeOf(bits.size()) / bitsPerSymbol;
    Array<float> symbols(static_cast<py::ssize_t>(bitsPerSymbol == 1 ? count : 2 * count));
    run([&, to = symbols.mutable_data()] { return morvik_link_map(bitsPerSymbol, bits.data(), count, to); });
    return symbols;
}

Array<float> demap(std::uint32_t bitsPerSymbol,
                   std::int32_t demapper,
                   const Array<float>& symbols,
                   const std::optional<Array<float>>& gains,
                   float noiseVariance)
{
    const std::size_t count = sizeOf(symbols.size()) / (bitsPerSymbol == 1 ? 1 : 2);
    Array<float> ratios(static_cast<py::ssize_t>(count * bitsPerSymbol));
    const float* const amplitudes = gains ? gains->data() : nullptr;
    run([&, to = ratios.mutable_data()] {
        return morvik_link_demap(bitsPerSymbol, demapper, symbols.data(), amplitudes, noiseVariance, count, to);
    });
    return ratios;
}

/// The ratios of rows of coded bits, each a frame of a simulation with this seed. The package has checked the names.
Array<float> transmit(const Array<std::uint8_t>& bits,
                      std::uint32_t bitsPerSymbol,
                      const std::string& channel,
                      const std::string& demapper,
                      int milliDecibels,
                      std::uint64_t seed)
{
    const link::SymbolFormat format{link::modulations[bitsPerSymbol / 2],
                                    link::fadingOf(channel).value(),
                                    link::demapperOf(demapper).value(),
                                    milliDecibels};
    Array<float> ratios = matrix<float>(rows(bits), columns(bits));
    run([&, from = bits.data(), to = ratios.mutable_data(), count = columns(bits), blocks = rows(bits)] {
        link::transmitRows(format, seed, from, blocks, count, to);
        return MORVIK_LINK_OK;
    });
    return ratios;
}

// ---- Transport blocks

/// A transmitter and receiver of one format.
class Transport {
public:
    Transport(std::uint32_t size,
              std::uint32_t codedBits,
              std::uint32_t bitsPerSymbol,
              std::uint32_t layers,
              std::uint32_t softBufferSize)
        : itsCodedBits(codedBits)
    {
        const morvik_link_format format{size, codedBits, bitsPerSymbol, layers, softBufferSize};
        morvik_link_transport* made = nullptr;
        expect(morvik_link_transport_create(&format, &made));
        itsTransport.reset(made);
    }

    std::uint32_t bufferSize() const
    {
        return morvik_link_transport_buffer_size(itsTransport.get());
    }

    /// The members of morvik_link_places, in their order.
    py::tuple codeBlock(std::uint32_t r) const
    {
        const morvik_link_places places = placesOf(r);
        return py::make_tuple(places.size,
                              places.fillers,
                              places.payload,
                              places.payload_at,
                              places.coded_bits,
                              places.coded_at,
                              places.buffer_size,
                              places.buffer_at);
    }

    Array<std::uint8_t> encode(std::uint32_t version, const Array<std::uint8_t>& bits)
    {
        Array<std::uint8_t> coded = matrix<std::uint8_t>(rows(bits), itsCodedBits);
        // The lock also keeps other threads away, as the encoder has memory of its own.
        expect(
            morvik_link_transport_encode(itsTransport.get(), version, rows(bits), bits.data(), coded.mutable_data()));
        return coded;
    }

    void recover(std::uint32_t version, const Array<float>& ratios, Array<float>& buffers) const
    {
        run([&, to = buffers.mutable_data()] {
            return morvik_link_transport_recover(itsTransport.get(), version, rows(ratios), ratios.data(), to);
        });
    }

    void recoverIntegers(std::uint32_t version,
                         const Array<std::int16_t>& ratios,
                         std::uint32_t width,
                         Array<std::int16_t>& buffers) const
    {
        run([&, to = buffers.mutable_data()] {
            return morvik_link_transport_recover_i16(
                itsTransport.get(), version, rows(ratios), ratios.data(), width, to);
        });
    }

    Streams<std::int8_t> softValues(std::uint32_t r, const Array<float>& buffers, float scale) const
    {
        Streams<std::int8_t> streams = streamsOf<std::int8_t>(rows(buffers), placesOf(r).size);
        run([&, sys = streams[0].mutable_data(), par1 = streams[1].mutable_data(), par2 = streams[2].mutable_data()] {
            return morvik_link_transport_soft_values(
                itsTransport.get(), r, rows(buffers), buffers.data(), scale, sys, par1, par2);
        });
        return streams;
    }

    Streams<std::int8_t> softValuesOfIntegers(std::uint32_t r, const Array<std::int16_t>& buffers) const
    {
        Streams<std::int8_t> streams = streamsOf<std::int8_t>(rows(buffers), placesOf(r).size);
        expect(morvik_link_transport_soft_values_i16(itsTransport.get(),
                                                     r,
                                                     rows(buffers),
                                                     buffers.data(),
                                                     streams[0].mutable_data(),
                                                     streams[1].mutable_data(),
                                                     streams[2].mutable_data()));
        return streams;
    }

    /// Fills the bits of code block r in, and returns whether each one's CRC fits.
    Array<std::uint8_t> join(std::uint32_t r, const Array<std::uint8_t>& decisions, Array<std::uint8_t>& bits) const
    {
        Array<std::uint8_t> fits(decisions.shape(0));
        expect(morvik_link_transport_join(
            itsTransport.get(), r, rows(decisions), decisions.data(), bits.mutable_data(), fits.mutable_data()));
        return fits;
    }

    Array<std::uint8_t> check(const Array<std::uint8_t>& bits) const
    {
        Array<std::uint8_t> fits(bits.shape(0));
        expect(morvik_link_transport_check(itsTransport.get(), rows(bits), bits.data(), fits.mutable_data()));
        return fits;
    }

private:
    struct Destroy {
        void operator()(morvik_link_transport* transport) const
        {
            morvik_link_transport_destroy(transport);
        }
    };

    morvik_link_places placesOf(std::uint32_t r) const
    {
        morvik_link_places places;
        expect(morvik_link_transport_code_block(itsTransport.get(), r, &places));
        return places;
    }

    std::uint32_t itsCodedBits;
    std::unique_ptr<morvik_link_transport, Destroy> itsTransport;
};

void addTransport(py::module_& module)
{
    using py::arg;
    py::class_<Transport>(module, "Transport")
        .def(py::init<std::uint32_t, std::uint32_t, std::uint32_t, std::uint32_t, std::uint32_t>(),
             arg("size"),
             arg("coded_bits"),
             arg("bits_per_symbol"),
             arg("layers"),
             arg("soft_buffer_size"))
        .def_property_readonly("buffer_size", &Transport::bufferSize)
        .def("code_block", &Transport::codeBlock, arg("r"))
        .def("encode", &Transport::encode, arg("version"), arg("bits").noconvert())
        .def("recover", &Transport::recover, arg("version"), arg("ratios").noconvert(), arg("buffers").noconvert())
        .def("recover_integers",
             &Transport::recoverIntegers,
             arg("version"),
             arg("ratios").noconvert(),
             arg("width"),
             arg("buffers").noconvert())
        .def("soft_values", &Transport::softValues, arg("r"), arg("buffers").noconvert(), arg("scale"))
        .def("soft_values_of_integers", &Transport::softValuesOfIntegers, arg("r"), arg("buffers").noconvert())
        .def("join", &Transport::join, arg("r"), arg("decisions").noconvert(), arg("bits").noconvert())
        .def("check", &Transport::check, arg("bits").noconvert());
}

}  // namespace

void addLte(py::module_& module)
{
    using py::arg;
    module.def("crc", crc, arg("bits").noconvert(), arg("is_of_code_block"));
    module.def("segment", segment, arg("transport_block_size"));
    module.def("rate_match", rateMatch, arg("matching"), arg("version"), arg("streams"), arg("count"));
    module.def("soft_buffer_size", softBufferSize, arg("matching"));
    module.def("rate_recover",
               rateRecover,
               arg("matching"),
               arg("version"),
               arg("ratios").noconvert(),
               arg("buffers").noconvert());
    module.def("rate_recover_integers",
               rateRecoverIntegers,
               arg("matching"),
               arg("version"),
               arg("ratios").noconvert(),
               arg("width"),
               arg("buffers").noconvert());
    module.def("deinterleave", deinterleave<float>, arg("matching"), arg("buffers").noconvert(), arg("filler"));
    module.def(
        "deinterleave_integers", deinterleave<std::int8_t>, arg("matching"), arg("buffers").noconvert(), arg("filler"));
    module.def("soft_values", softValues, arg("ratios").noconvert(), arg("scale"));
    module.def("soft_integers", softIntegers, arg("ratios").noconvert(), arg("scale"), arg("width"));
    module.def(
        "ratio_scale",
        [](int algorithm, std::uint32_t bitsPerSymbol, double codeRate) {
            return link::ratioScale(algorithm, link::modulations[bitsPerSymbol / 2], codeRate);
        },
        arg("algorithm"),
        arg("bits_per_symbol"),
        arg("code_rate"));
    module.def("map", map, arg("bits_per_symbol"), arg("bits").noconvert());
    module.def("demap",
               demap,
               arg("bits_per_symbol"),
               arg("demapper"),
               arg("symbols").noconvert(),
               arg("gains"),
               arg("noise_variance"));
    module.def("transmit_symbols",
               transmit,
               arg("bits").noconvert(),
               arg("bits_per_symbol"),
               arg("channel"),
               arg("demapper"),
               arg("milli_decibels"),
               arg("seed"));
    addTransport(module);
}

}  // namespace morvik::python
