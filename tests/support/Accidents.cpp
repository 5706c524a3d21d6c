// Accidents: common mistakes in files of soft values, made on purpose.
#include "Accidents.h"

#include <algorithm>
#include <array>
#include <cmath>
#include <sstream>

namespace morvik::support {

namespace {

using blocks::Stream;

std::array<Stream*, 3> streamsOf(SentFrame& frame)
{
    return {&frame.soft.sys, &frame.soft.par1, &frame.soft.par2};
}

/// The standard's tail, separated into systematic and parity values of both encoders.
struct Tail {
    std::array<int, 3> x, z, x2, z2;
};

Tail tailOf(const SentFrame& frame)
{
    const auto& [s, p, q] = frame.soft;
    const std::size_t K = frame.bits.size();
    return {{s[K], q[K], p[K + 1]},
            {p[K], s[K + 1], q[K + 1]},
            {s[K + 2], q[K + 2], p[K + 3]},
            {p[K + 2], s[K + 3], q[K + 3]}};
}

/// Writes values into the tail, row by row or column by column.
void writeTail(SentFrame& frame, const std::vector<int>& values, bool byRows = true)
{
    const std::size_t K = frame.bits.size();
    for (std::size_t i = 0; i < 12; ++i) {
        const std::size_t row = byRows ? i / 3 : i % 4;
        const std::size_t column = byRows ? i % 3 : i / 4;
        (*streamsOf(frame)[column])[K + row] = values[i];
    }
}

void negate(Stream& stream)
{
    for (std::int32_t& value : stream) {
        value = -value;
    }
}

/// Inserts `count` rows of small values before row `place`.
void insertRows(SentFrame& frame, std::size_t place, std::size_t count)
{
    for (Stream* stream : streamsOf(frame)) {
        for (std::size_t i = 0; i < count; ++i) {
            stream->insert(stream->begin() + static_cast<std::ptrdiff_t>(place), static_cast<int>(i % 3) - 1);
        }
    }
}

std::vector<int> apart(const Tail& t)
{
    return {t.x[0], t.x[1], t.x[2], t.z[0], t.z[1], t.z[2], t.x2[0], t.x2[1], t.x2[2], t.z2[0], t.z2[1], t.z2[2]};
}

std::vector<int> together(const std::array<int, 3>& x, const std::array<int, 3>& z)
{
    return {x[0], z[0], x[1], z[1], x[2], z[2]};
}

std::vector<int> joined(std::vector<int> a, const std::vector<int>& b)
{
    a.insert(a.end(), b.begin(), b.end());
    return a;
}

void byTrellisSteps(SentFrame& frame)
{
    const Tail t = tailOf(frame);
    writeTail(frame,
              {t.x[0], t.z[0], t.z2[0], t.x[1], t.z[1], t.z2[1], t.x[2], t.z[2], t.z2[2], t.x2[0], t.x2[1], t.x2[2]});
}

std::vector<Accident> tailAccidents()
{
    return {{"tail", "the tail continues each stream: x z z' of each step, then x' x' x'", byTrellisSteps},
            {"tail",
             "the tail is written column by column",
             [](SentFrame& frame) {
                 const Tail t = tailOf(frame);
                 writeTail(frame, joined(together(t.x, t.z), together(t.x2, t.z2)), false);
             }},
            {"tail",
             "the tail is written as x x x z z z, row by row",
             [](SentFrame& frame) {
                 writeTail(frame, apart(tailOf(frame)));
             }},
            {"tail",
             "the tail is written as x x x z z z, column by column",
             [](SentFrame& frame) {
                 writeTail(frame, apart(tailOf(frame)), false);
             }},
            {"tail", "the tail has the second encoder's values first", [](SentFrame& frame) {
                 const Tail t = tailOf(frame);
                 writeTail(frame, joined(together(t.x2, t.z2), together(t.x, t.z)));
             }}};
}

std::vector<Accident> columnAccidents()
{
    return {{"columns",
             "rsc1_par and rsc2_par are swapped",
             [](SentFrame& f) {
                 std::swap(f.soft.par1, f.soft.par2);
             }},
            {"columns",
             "rsc1_sys and rsc1_par are swapped",
             [](SentFrame& f) {
                 std::swap(f.soft.sys, f.soft.par1);
             }},
            {"columns",
             "rsc1_sys and rsc2_par are swapped",
             [](SentFrame& f) {
                 std::swap(f.soft.sys, f.soft.par2);
             }},
            {"columns",
             "the columns are rsc1_par, rsc2_par, rsc1_sys",
             [](SentFrame& f) {
                 f.soft = {f.soft.par1, f.soft.par2, f.soft.sys};
             }},
            {"columns", "the columns are rsc2_par, rsc1_sys, rsc1_par", [](SentFrame& f) {
                 f.soft = {f.soft.par2, f.soft.sys, f.soft.par1};
             }}};
}

std::vector<Accident> signAccidents()
{
    return {{"sign",
             "the sign of all soft values is flipped",
             [](SentFrame& f) {
                 for (Stream* stream : streamsOf(f)) {
                     negate(*stream);
                 }
             }},
            {"sign",
             "the sign of rsc1_sys is flipped",
             [](SentFrame& f) {
                 negate(f.soft.sys);
             }},
            {"sign", "the sign of rsc1_par and rsc2_par is flipped", [](SentFrame& f) {
                 negate(f.soft.par1);
                 negate(f.soft.par2);
             }}};
}

std::vector<Accident> orderAccidents()
{
    return {{"order",
             "the rows are reversed, tail first",
             [](SentFrame& f) {
                 for (Stream* stream : streamsOf(f)) {
                     std::reverse(stream->begin(), stream->end());
                 }
             }},
            {"order",
             "the data rows are reversed, the tail rows are not",
             [](SentFrame& f) {
                 for (Stream* stream : streamsOf(f)) {
                     std::reverse(stream->begin(), stream->end() - 4);
                 }
             }},
            {"order",
             "the bits of the reference are reversed",
             [](SentFrame& f) {
                 std::reverse(f.bits.begin(), f.bits.end());
             }},
            {"order",
             "the bits of each byte of the reference are reversed",
             [](SentFrame& f) {
                 for (auto byte = f.bits.begin(); byte != f.bits.end(); byte += 8) {
                     std::reverse(byte, byte + 8);
                 }
             }},
            {"order", "the reference has 0 for 1 and 1 for 0", [](SentFrame& f) {
                 for (int& bit : f.bits) {
                     bit = 1 - bit;
                 }
             }}};
}

std::vector<Accident> rowAccidents()
{
    return {{"rows",
             "the tail is missing: a block of K bits has K + 4 rows",
             [](SentFrame& f) {
                 for (Stream* stream : streamsOf(f)) {
                     stream->resize(f.bits.size());
                 }
             }},
            {"rows",
             "there are extra rows after the block",
             [](SentFrame& f) {
                 insertRows(f, f.bits.size() + 4, 20);
             }},
            {"rows",
             "there are extra rows before the block",
             [](SentFrame& f) {
                 insertRows(f, 0, 20);
             }},
            {"rows", "there are extra rows between data and tail", [](SentFrame& f) {
                 insertRows(f, f.bits.size(), 20);
             }}};
}

}  // namespace

std::vector<SentFrame> sentFrames(unsigned K, unsigned count, double deviation, unsigned seed)
{
    blocks::Random random(seed);
    std::vector<SentFrame> frames;
    for (unsigned i = 0; i < count; ++i) {
        const std::vector<int> bits = blocks::randomBits(random, K);
        frames.push_back({blocks::encode(bits, 8), bits});
        blocks::addNoise(random, deviation, frames.back().soft);
    }
    return frames;
}

const std::vector<Accident>& accidents()
{
    static const std::vector<Accident> all = [] {
        std::vector<Accident> list;
        for (const auto& some :
             {tailAccidents(), columnAccidents(), signAccidents(), orderAccidents(), rowAccidents()}) {
            list.insert(list.end(), some.begin(), some.end());
        }
        return list;
    }();
    return all;
}

void multiply(SentFrame& frame, double factor)
{
    for (Stream* stream : streamsOf(frame)) {
        for (std::int32_t& value : *stream) {
            value = static_cast<std::int32_t>(std::lround(factor * value));
        }
    }
}

std::string softText(const std::vector<SentFrame>& frames)
{
    std::ostringstream text;
    text << "block,rsc1_sys,rsc1_par,rsc2_par\n";
    for (std::size_t frame = 0; frame < frames.size(); ++frame) {
        const auto& [sys, par1, par2] = frames[frame].soft;
        for (std::size_t i = 0; i < sys.size(); ++i) {
            text << frame << ',' << sys[i] << ',' << par1[i] << ',' << par2[i] << '\n';
        }
    }
    return text.str();
}

std::string bitText(const std::vector<SentFrame>& frames)
{
    std::string text;
    for (const SentFrame& frame : frames) {
        for (const int bit : frame.bits) {
            text += bit != 0 ? '1' : '0';
        }
        text += '\n';
    }
    return text;
}

}  // namespace morvik::support
