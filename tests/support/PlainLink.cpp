// PlainLink: transport blocks step by step as 3GPP TS 36.212, clause 5.1, words it.
#include "PlainLink.h"

#include <algorithm>
#include <array>

#include "Blocks.h"

namespace morvik::plain {

namespace {

constexpr int null = -1;

/// The remainder of the polynomial with the given bits, times D^24, after division by the generator.
Bits remainder(Bits bits, const std::vector<unsigned>& powers)
{
    bits.resize(bits.size() + 24, 0);
    for (std::size_t i = 0; i + 24 < bits.size(); ++i) {
        if (bits[i] != 0) {
            for (const unsigned power : powers) {
                bits[i + 24 - power] ^= 1;
            }
        }
    }
    return {bits.end() - 24, bits.end()};
}

/// Clause 5.1.4.1.1: the order in which the interleaver reads D bits; null for dummy bits.
std::vector<int> subBlockInterleaver(unsigned D, bool third)
{
    const std::array<unsigned, 32> P = {0, 16, 8, 24, 4, 20, 12, 28, 2, 18, 10, 26, 6, 22, 14, 30,
                                        1, 17, 9, 25, 5, 21, 13, 29, 3, 19, 11, 27, 7, 23, 15, 31};
    unsigned R = 0;
    while (R * 32 < D) {
        ++R;
    }
    std::vector<int> y(R * 32 - D, null);
    for (unsigned k = 0; k < D; ++k) {
        y.push_back(static_cast<int>(k));
    }
    std::vector<int> v;
    for (unsigned k = 0; k < R * 32; ++k) {
        v.push_back(third ? y[(P[k / R] + 32 * (k % R) + 1) % (R * 32)] : y[(k % R) * 32 + P[k / R]]);
    }
    return v;
}

/// Clause 5.1.4.1.2 before the selection: stream and position of each bit, k = null for <NULL>.
struct Entry {
    unsigned stream;
    int k;
};

std::vector<Entry> bitCollection(unsigned K, unsigned F)
{
    const std::vector<int> v01 = subBlockInterleaver(K + 4, false);
    const std::vector<int> v2 = subBlockInterleaver(K + 4, true);
    const auto sent = [F](int k) {
        return k < static_cast<int>(F) ? null : k;
    };
    std::vector<Entry> w;
    for (const int k : v01) {
        w.push_back({0, sent(k)});
    }
    for (std::size_t k = 0; k < v01.size(); ++k) {
        w.push_back({1, sent(v01[k])});
        w.push_back({2, v2[k]});
    }
    return w;
}

/// Bit selection: appends E places of code block r.
void select(const std::vector<Entry>& w, unsigned Ncb, unsigned rv, unsigned E, unsigned r, std::vector<Place>& places)
{
    const auto R = static_cast<unsigned>(w.size() / 96);
    const unsigned k0 = R * (2 * ((Ncb + 8 * R - 1) / (8 * R)) * rv + 2);
    unsigned k = 0;
    for (unsigned j = 0; k < E; ++j) {
        const Entry& entry = w[(k0 + j) % Ncb];
        if (entry.k != null) {
            places.push_back({r, entry.stream, static_cast<unsigned>(entry.k)});
            ++k;
        }
    }
}

}  // namespace

Bits crc24A(const Bits& bits)
{
    return remainder(bits, {24, 23, 18, 17, 14, 11, 10, 7, 6, 5, 4, 3, 1, 0});
}

Bits crc24B(const Bits& bits)
{
    return remainder(bits, {24, 23, 6, 5, 1, 0});
}

CodeBlockSizes codeBlockSizes(unsigned A)
{
    const std::vector<unsigned> sizes = blocks::blockSizes();
    const unsigned Z = 6144;
    const unsigned B = A + 24;
    unsigned L = 0;
    unsigned C = 1;
    unsigned Bprime = B;
    if (B > Z) {
        L = 24;
        C = (B + (Z - L) - 1) / (Z - L);
        Bprime = B + C * L;
    }
    std::size_t i = 0;
    while (C * sizes[i] < Bprime) {
        ++i;
    }
    CodeBlockSizes s{C, sizes[i], 1, 0, 0, 0};
    if (C > 1) {
        s.Kminus = sizes[i - 1];
        s.Cminus = (C * s.Kplus - Bprime) / (s.Kplus - s.Kminus);
        s.Cplus = C - s.Cminus;
    }
    s.F = s.Cplus * s.Kplus + s.Cminus * s.Kminus - Bprime;
    return s;
}

std::vector<Bits> codeBlocks(const Bits& transportBlock)
{
    const CodeBlockSizes s = codeBlockSizes(static_cast<unsigned>(transportBlock.size()));
    Bits b = transportBlock;
    const Bits parity = crc24A(transportBlock);
    b.insert(b.end(), parity.begin(), parity.end());
    std::vector<Bits> made;
    auto next = b.begin();
    for (unsigned r = 0; r < s.C; ++r) {
        Bits c(r == 0 ? s.F : 0, 0);
        while (c.size() < s.size(r) - (s.C > 1 ? 24 : 0)) {
            c.push_back(*next++);
        }
        if (s.C > 1) {
            const Bits own = crc24B(c);
            c.insert(c.end(), own.begin(), own.end());
        }
        made.push_back(c);
    }
    return made;
}

std::vector<Place> codedPlaces(const Format& format, unsigned rv)
{
    const CodeBlockSizes s = codeBlockSizes(format.A);
    const unsigned perSymbol = format.NL * format.Qm;
    const unsigned Gprime = format.G / perSymbol;
    const unsigned gamma = Gprime % s.C;
    std::vector<Place> places;
    for (unsigned r = 0; r < s.C; ++r) {
        const unsigned E = perSymbol * (r + gamma + 1 <= s.C ? Gprime / s.C : (Gprime + s.C - 1) / s.C);
        const std::vector<Entry> w = bitCollection(s.size(r), r == 0 ? s.F : 0);
        const auto Kw = static_cast<unsigned>(w.size());
        select(w, format.NIR == 0 ? Kw : std::min(format.NIR / s.C, Kw), rv, E, r, places);
    }
    return places;
}

Bits encode(const Format& format, unsigned rv, const Bits& transportBlock)
{
    std::vector<blocks::Block> encoded;
    for (const Bits& block : codeBlocks(transportBlock)) {
        encoded.push_back(blocks::encode(block, 1));
    }
    Bits coded;
    for (const Place& place : codedPlaces(format, rv)) {
        const blocks::Block& block = encoded[place.r];
        const std::array streams = {&block.sys, &block.par1, &block.par2};
        coded.push_back((*streams[place.stream])[place.k] > 0 ? 1 : 0);
    }
    return coded;
}

}  // namespace morvik::plain
