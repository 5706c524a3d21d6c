// ChainSender: transport blocks sent bit by bit as 3GPP TS 36.212 words it, with mistakes made on purpose.
#include "ChainSender.h"

#include <algorithm>
#include <numeric>

namespace morvik::support {

namespace {

constexpr int null = -1;

/// A number of mean 0 and deviation 1.
double noise(blocks::Random& random)
{
    double sum = -6;
    for (unsigned i = 0; i < 12; ++i) {
        sum += static_cast<double>(random()) / 4294967296.0;
    }
    return sum;
}

unsigned rowsOf(unsigned K)
{
    return (K + 4 + 31) / 32;
}

}  // namespace

/// The circular buffer w of clause 5.1.4.1.2: bits, or null.
std::vector<int> ChainSender::bufferOf(const plain::Bits& block, unsigned fillers) const
{
    const auto K = static_cast<unsigned>(block.size());
    const unsigned R = rowsOf(K);
    const unsigned dummies = 32 * R - (K + 4);
    const blocks::Block word = blocks::encode(block, 1);
    std::vector<std::vector<int>> v;
    for (const blocks::Stream* stream : {&word.sys, &word.par1, &word.par2}) {
        const bool isSecond = v.size() == 2;
        std::vector<int> y(dummiesLast ? 0 : dummies, null);
        for (unsigned k = 0; k < K + 4; ++k) {
            const bool isFiller = k < fillers && !isSecond && !sendsFillers;
            y.push_back(isFiller ? null : ((*stream)[k] > 0 ? 1 : 0));
        }
        y.resize(32 * R, null);
        std::vector<int> out;
        for (unsigned k = 0; k < 32 * R; ++k) {
            const unsigned place = columnOrder[k / R] + 32 * (k % R) + (isSecond ? delay : 0);
            out.push_back(interleaves ? y[place % (32 * R)] : y[k]);
        }
        v.push_back(out);
    }
    std::vector<int> w;
    const auto append = [&w](const std::vector<int>& stream) {
        w.insert(w.end(), stream.begin(), stream.end());
    };
    if (!alternates || order[2] == 0) {
        if (alternates) {
            for (unsigned k = 0; k < 32 * R; ++k) {
                w.push_back(v[order[0]][k]);
                w.push_back(v[order[1]][k]);
            }
            append(v[0]);
            return w;
        }
        for (const unsigned stream : order) {
            append(v[stream]);
        }
        return w;
    }
    append(v[order[0]]);
    for (unsigned k = 0; k < 32 * R; ++k) {
        w.push_back(v[order[1]][k]);
        w.push_back(v[order[2]][k]);
    }
    return w;
}

plain::Bits ChainSender::codedBits(const plain::Bits& block, unsigned version) const
{
    const plain::CodeBlockSizes cut = plain::codeBlockSizes(format.A);
    const std::vector<plain::Bits> codeBlocks = plain::codeBlocks(block);
    std::vector<plain::Bits> parts;
    for (unsigned r = 0; r < cut.C; ++r) {
        std::vector<int> w = bufferOf(codeBlocks[r], r == 0 ? cut.F : 0);
        if (format.NIR != 0) {
            w.resize(std::min<std::size_t>(w.size(), format.NIR / cut.C));
        }
        const unsigned symbols = format.G / format.Qm;
        const unsigned more = symbols % cut.C;
        const bool isLonger = longerFirst ? r < more : r >= cut.C - more;
        const unsigned E = format.Qm * (symbols / cut.C + (isLonger ? 1 : 0));
        const unsigned R = rowsOf(cut.size(r));
        const auto Ncb = static_cast<unsigned>(w.size());
        std::size_t j = R * (2 * ((Ncb + 8 * R - 1) / (8 * R)) * version + offset);
        parts.emplace_back();
        for (; parts.back().size() < E; ++j) {
            if (w[j % Ncb] != null) {
                parts.back().push_back(w[j % Ncb]);
            }
        }
    }
    if (backwards) {
        std::reverse(parts.begin(), parts.end());
    }
    plain::Bits coded;
    for (const plain::Bits& part : parts) {
        coded.insert(coded.end(), part.begin(), part.end());
    }
    return coded;
}

std::vector<std::vector<float>> ChainSender::send(const plain::Bits& block,
                                                  double deviation,
                                                  blocks::Random& random) const
{
    std::vector<std::vector<float>> rows;
    for (const unsigned version : versions) {
        const plain::Bits coded = codedBits(block, version);
        std::vector<float> right;
        for (unsigned i = 0; i < coded.size(); ++i) {
            const double received = (coded[i] != 0 ? 1 : -1) + deviation * noise(random);
            const double ratio = factor * 2 * received / (deviation * deviation);
            right.push_back(static_cast<float>(flips(i % format.Qm) ? -ratio : ratio));
        }
        rows.push_back(right);
        for (unsigned i = 0; i < right.size() && !symbol.empty(); ++i) {
            rows.back()[i] = right[i - i % format.Qm + symbol[i % format.Qm]];
        }
    }
    return rows;
}

std::vector<ChainAccident> accidentsOf(const ChainSender& sender)
{
    std::vector<ChainAccident> all = {
        {"version",
         "transmission 1 has redundancy version 3, not " + std::to_string(sender.versions[0]),
         [](ChainSender& s) {
             s.versions[0] = 3;
         }},
        {"interleaver",
         "the columns of the sub-block interleaver are not permuted",
         [](ChainSender& s) {
             std::iota(s.columnOrder.begin(), s.columnOrder.end(), 0U);
         }},
        {"interleaver",
         "the sub-block interleaver is left out, or read by rows",
         [](ChainSender& s) {
             s.interleaves = false;
         }},
        {"interleaver",
         "the second parity is read from the sub-block interleaver as the first",
         [](ChainSender& s) {
             s.delay = 0;
         }},
        {"interleaver",
         "the dummy bits of the sub-block interleaver stand at its end",
         [](ChainSender& s) {
             s.dummiesLast = true;
         }},
        {"buffer",
         "the parities are swapped in the circular buffer",
         [](ChainSender& s) {
             s.order = {0, 2, 1};
         }},
        {"buffer",
         "the parities stand one after the other in the circular buffer, not alternately",
         [](ChainSender& s) {
             s.alternates = false;
         }},
        {"buffer",
         "the systematic stream stands behind the parities in the circular buffer",
         [](ChainSender& s) {
             s.order = {1, 2, 0};
         }},
        {"offset",
         "redundancy versions start two columns too early",
         [](ChainSender& s) {
             s.offset = 0;
         }},
        {"flip",
         "the sign of all values is flipped",
         [](ChainSender& s) {
             s.flips = [](unsigned) {
                 return true;
             };
         }},
        {"symbol", "I and Q are swapped", [](ChainSender& s) {
             for (unsigned i = 0; i < s.format.Qm; ++i) {
                 s.symbol.push_back(i ^ 1U);
             }
         }}};
    const plain::CodeBlockSizes cut = plain::codeBlockSizes(sender.format.A);
    if (cut.F > 0) {
        all.push_back({"fillers", "filler bits are taken as data", [](ChainSender& s) {
                           s.sendsFillers = true;
                       }});
    }
    if (cut.C > 1) {
        all.push_back({"split", "the code blocks are concatenated backwards", [](ChainSender& s) {
                           s.backwards = true;
                       }});
        all.push_back({"split", "the first code blocks, not the last, have a symbol more", [](ChainSender& s) {
                           s.longerFirst = true;
                       }});
    }
    if (sender.format.Qm > 2) {
        all.push_back({"symbol", "the bits of each symbol are reversed", [](ChainSender& s) {
                           for (unsigned i = 0; i < s.format.Qm; ++i) {
                               s.symbol.push_back(s.format.Qm - 1 - i);
                           }
                       }});
        all.push_back({"flip",
                       "the sign of the values of all bits but the first two of each symbol is flipped",
                       [](ChainSender& s) {
                           s.flips = [](unsigned bit) {
                               return bit >= 2;
                           };
                       }});
        all.push_back({"symbol", "each symbol has its signs last", [](ChainSender& s) {
                           for (unsigned i = 0; i < s.format.Qm; ++i) {
                               s.symbol.push_back(s.format.Qm - 2 - i / 2 * 2 + i % 2);
                           }
                       }});
        all.push_back({"symbol", "each symbol has all bits of I before those of Q", [](ChainSender& s) {
                           for (unsigned i = 0; i < s.format.Qm; ++i) {
                               s.symbol.push_back(i < s.format.Qm / 2 ? 2 * i : 2 * i + 1 - s.format.Qm);
                           }
                       }});
    }
    return all;
}

}  // namespace morvik::support
