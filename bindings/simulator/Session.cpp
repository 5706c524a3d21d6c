// Session: a decoder for a simulator's test bench: filled value by value, read bit by bit, its messages queued.
#include "Session.h"

#include <mutex>
#include <sstream>
#include <utility>

#include "base/OutputTurn.h"
#include "bindings/Listener.h"
#include "hardware/testbench/SizeHint.h"
#include "hardware/testbench/SoftBlock.h"

namespace morvik::simulator {

Session::Session(int numPu, int algorithm, int tagWidth)
{
    for (auto& stream : itsStreams) {
        stream.resize(maxPositions);
    }
    auto generics = veltra_ip_morvik_v1_0_get_default_generics();
    generics.C_NUM_PU = numPu;
    generics.C_ALGORITHM_TYPE = algorithm;
    generics.C_TAG_WIDTH = tagWidth;
    const std::lock_guard<std::mutex> lock(base::outputTurn());
    const Listener listener;
    itsState = veltra_ip_morvik_v1_0_create_state(generics);
    queue(listener.text());
}

Session::~Session()
{
    veltra_ip_morvik_v1_0_destroy_state(itsState);
}

void Session::put(int sys, int par1, int par2) noexcept
{
    if (itsPositions < maxPositions) {
        itsStreams[0][itsPositions] = sys;
        itsStreams[1][itsPositions] = par1;
        itsStreams[2][itsPositions] = par2;
    }
    ++itsPositions;
}

int Session::decode(int iterations, std::uint32_t tag)
{
    itsBits.clear();
    const std::size_t positions = std::exchange(itsPositions, 0U);  // cleared however the call ends
    int status = 1;
    if (!open()) {
        itsMessages.emplace_back("ERROR:binding:The generics of this decoder were refused, so it does not decode");
    } else if (positions == 0) {
        itsMessages.emplace_back(
            "ERROR:binding:The streams are empty, but a block of K bits has K + 4 soft values in each");
    } else if (positions > maxPositions) {
        itsMessages.push_back("ERROR:binding:Block size not supported" + sizeHint(positions));
    } else {
        status = simulate(positions, iterations, tag);
    }
    return status;
}

/// Results are stored last, so that running out of memory leaves none of them.
int Session::simulate(std::size_t positions, int iterations, std::uint32_t tag)
{
    std::array<std::uint8_t, maxPositions> bits;
    veltra_ip_morvik_v1_0_outputs outputs{bits.data(), static_cast<std::uint32_t>(bits.size()), 0, itsTag};
    const std::lock_guard<std::mutex> lock(base::outputTurn());
    const Listener listener;
    const int status = veltra_ip_morvik_v1_0_bitacc_simulate(itsState,
                                                             itsStreams[0].data(),
                                                             itsStreams[1].data(),
                                                             itsStreams[2].data(),
                                                             static_cast<std::int32_t>(positions),
                                                             static_cast<std::uint32_t>(iterations),
                                                             tag,
                                                             &outputs);
    queue(listener.text());
    if (status == 2 && !itsMessages.empty()) {
        itsMessages.back() += sizeHint(positions);
    }
    itsBits.assign(bits.begin(), bits.begin() + outputs.dout_size);
    itsTag = outputs.tag;
    return status;
}

const std::string& Session::nextMessage()
{
    itsMessage.clear();
    if (!itsMessages.empty()) {
        itsMessage.swap(itsMessages.front());
        itsMessages.pop_front();
    }
    return itsMessage;
}

void Session::queue(const std::string& lines)
{
    std::istringstream text(lines);
    for (std::string line; std::getline(text, line);) {
        itsMessages.push_back(line);
    }
}

}  // namespace morvik::simulator
