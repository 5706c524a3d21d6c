// Packing: serialises batches and their results, the same on every machine.
#include "Packing.h"

#include <algorithm>
#include <cstddef>
#include <cstdint>
#include <stdexcept>

namespace morvik::simulation {

namespace {

/// Appends a variable-length number: seven bits per byte, lowest first; the top bit tells that more follow.
void put(std::uint64_t number, std::string& bytes)
{
    while (number >= 0x80) {
        bytes += static_cast<char>(0x80 | (number & 0x7f));
        number >>= 7;
    }
    bytes += static_cast<char>(number);
}

void put(const Reception& reception, std::string& bytes)
{
    put(reception.codeBlockErrors, bytes);
    put(reception.undetected, bytes);
    put(reception.transmissions, bytes);
    put(reception.iterations, bytes);
}

void putBatch(const FrameBatch& batch, std::string& bytes)
{
    put(batch.point, bytes);
    put(batch.first, bytes);
    put(batch.count, bytes);
}

/// Reads packed numbers.
class Reader {
public:
    explicit Reader(std::string_view bytes) : itsBytes(bytes) {}

    bool isAtEnd() const
    {
        return itsBytes.empty();
    }

    /// Reads the next number. Throws if it is above `most`.
    std::uint64_t get(std::uint64_t most = UINT64_MAX)
    {
        std::uint64_t number = 0;
        bool goesOn = true;
        for (unsigned shift = 0; goesOn; shift += 7) {
            expect(!itsBytes.empty() && shift < 64);
            const auto byte = static_cast<unsigned char>(itsBytes.front());
            itsBytes.remove_prefix(1);
            number |= std::uint64_t{byte & 0x7fU} << shift;
            goesOn = (byte & 0x80U) != 0;
        }
        expect(number <= most);
        return number;
    }

    std::uint32_t get32()
    {
        return static_cast<std::uint32_t>(get(UINT32_MAX));
    }

    static void expect(bool isGood)
    {
        if (!isGood) {
            throw std::runtime_error("a message is damaged");
        }
    }

private:
    std::string_view itsBytes;
};

FrameBatch batchFrom(Reader& reader)
{
    FrameBatch batch;
    batch.point = static_cast<std::size_t>(reader.get(SIZE_MAX));
    batch.first = reader.get();
    batch.count = reader.get32();
    return batch;
}

}  // namespace

std::string packed(const FrameBatch& batch)
{
    std::string bytes;
    putBatch(batch, bytes);
    return bytes;
}

std::string packed(const BatchResult& result)
{
    std::string bytes;
    putBatch(result.batch, bytes);
    const std::size_t counts = result.clipped.empty() ? 0 : result.wrongBits.size() / result.clipped.size();
    put(counts, bytes);
    const bool hasReceptions = !result.receptions.empty();
    put(hasReceptions ? 1 : 0, bytes);
    std::size_t next = 0;  // the first frame not yet packed
    for (std::size_t frame = 0; frame < result.clipped.size(); ++frame) {
        const std::uint32_t* const wrongBits = result.wrongBits.data() + frame * counts;
        const bool isQuiet = std::all_of(wrongBits, wrongBits + counts, [](std::uint32_t wrong) { return wrong == 0; });
        if (isQuiet && result.clipped[frame] == 0 && !hasReceptions) {
            continue;
        }
        put(frame - next, bytes);
        put(result.clipped[frame], bytes);
        for (std::size_t i = 0; i < counts; ++i) {
            put(wrongBits[i], bytes);
            if (hasReceptions) {
                put(result.receptions[frame * counts + i], bytes);
            }
        }
        next = frame + 1;
    }
    return bytes;
}

FrameBatch unpackedBatch(std::string_view bytes)
{
    Reader reader(bytes);
    const FrameBatch batch = batchFrom(reader);
    Reader::expect(reader.isAtEnd());
    return batch;
}

BatchResult unpackedResult(std::string_view bytes)
{
    Reader reader(bytes);
    BatchResult result;
    result.batch = batchFrom(reader);
    constexpr std::uint64_t mostCounts = 15;  // iterations of the decoder
    const auto counts = static_cast<std::size_t>(reader.get(mostCounts));
    const std::size_t frames = result.batch.count;
    result.clipped.resize(frames);
    result.wrongBits.resize(frames * counts);
    result.receptions.resize(reader.get(1) == 1 ? frames * counts : 0);
    std::size_t frame = 0;
    while (!reader.isAtEnd()) {
        frame += static_cast<std::size_t>(reader.get(frames));
        Reader::expect(frame < frames);
        result.clipped[frame] = reader.get32();
        for (std::size_t i = 0; i < counts; ++i) {
            result.wrongBits[frame * counts + i] = reader.get32();
            if (!result.receptions.empty()) {
                result.receptions[frame * counts + i] = {reader.get(), reader.get(), reader.get(), reader.get()};
            }
        }
        ++frame;
    }
    return result;
}

}  // namespace morvik::simulation
