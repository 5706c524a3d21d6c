// ChainEvidence: how well soft values of transport blocks agree with their coded bits, for many mistakes.
#include "ChainEvidence.h"

#include <algorithm>
#include <cmath>
#include <cstdlib>
#include <iterator>
#include <limits>

#include "rules/Tail.h"

namespace morvik::diagnosis {

namespace {

/// Values that are enough for every decision.
constexpr std::size_t enoughValues = std::size_t{1} << 18;

/// Log odds that another redundancy version needs.
constexpr double enoughForVersion = 12;

std::vector<std::int8_t> signsOf(const std::vector<float>& values)
{
    std::vector<std::int8_t> signs(values.size());
    std::transform(values.begin(), values.end(), signs.begin(), [](float value) {
        return static_cast<std::int8_t>((value > 0 ? 1 : 0) - (value < 0 ? 1 : 0));
    });
    return signs;
}

/// The code word of each code block as signs: its streams, one after the other.
std::vector<std::vector<std::int8_t>> codeWordsOf(const link::TransportBlockCode& code,
                                                  const std::vector<std::uint8_t>& sent)
{
    std::vector<std::uint64_t> row(link::wordsOf(sent.size()));
    link::packBits(sent.data(), sent.size(), row.data());
    std::vector<std::vector<std::int8_t>> words;
    for (unsigned r = 0; r < code.blocks().count; ++r) {
        std::vector<std::uint64_t> block(link::wordsOf(code.blocks().size(r)));
        code.frame(row.data(), r, block.data());
        std::vector<std::uint8_t> bits(code.blocks().size(r));
        link::unpackBits(block.data(), bits.size(), bits.data());
        words.emplace_back();
        for (const std::vector<std::uint8_t>& stream : encoded(bits)) {
            for (const std::uint8_t bit : stream) {
                words.back().push_back(bit != 0 ? 1 : -1);
            }
        }
    }
    return words;
}

/// The signs in the order of a circular buffer.
std::vector<std::int8_t> inOrder(const std::vector<std::int8_t>& word, const std::vector<std::uint16_t>& places)
{
    std::vector<std::int8_t> ordered(places.size());
    std::transform(places.begin(), places.end(), ordered.begin(), [&word](std::uint16_t place) { return word[place]; });
    return ordered;
}

/// The sum of products.
long long agreement(const std::int8_t* a, const std::int8_t* b, std::size_t count)
{
    int sum = 0;
    for (std::size_t i = 0; i < count; ++i) {
        sum += a[i] * b[i];
    }
    return sum;
}

/// The agreement of received signs with the buffer's first `size` bits, read from `start` on and around.
long long agreementAround(
    const std::int8_t* signs, std::size_t count, const std::int8_t* buffer, unsigned size, unsigned start)
{
    long long sum = 0;
    for (std::size_t done = 0; done < count && size > 0;) {
        const std::size_t now = std::min<std::size_t>(count - done, size - start);
        sum += agreement(signs + done, buffer + start, now);
        done += now;
        start = 0;
    }
    return sum;
}

}  // namespace

ChainEvidence::ChainEvidence(const ChainFormat& format, const std::vector<ChainCase>& cases)
    : itsFormat(format), itsCode(codingOf(format))
{
    for (const ChainCase& each : cases) {
        if (each.sent.empty() || itsAll >= static_cast<double>(enoughValues)) {
            continue;
        }
        itsKnown.push_back({{}, codeWordsOf(itsCode, each.sent)});
        for (const std::vector<float>& row : each.rows) {
            itsKnown.back().rows.push_back(diagnosis::signsOf(row));
            itsAll += static_cast<double>(row.size());
        }
    }
}

Signs ChainEvidence::signsOf(long long sum) const
{
    return {(itsAll - static_cast<double>(sum)) / 2, itsAll};
}

/// The agreement of every transmission with every redundancy version.
ChainEvidence::Tally ChainEvidence::tallied(const ChainMistakes& mistakes) const
{
    Tally tally = {mistakes, Sums(itsFormat.versions.size())};
    const link::CodeBlocks& blocks = itsCode.blocks();
    const std::vector<Part> parts = partsOf(itsCode, mistakes.split);
    std::vector<std::vector<Row>> received;
    for (const Known& known : itsKnown) {
        received.emplace_back();
        for (const Row& row : known.rows) {
            received.back().push_back(restoredSymbols(row, itsFormat.modulation, mistakes));
        }
    }
    CircularBuffer buffer;
    for (unsigned r = 0; r < blocks.count; ++r) {
        if (r <= 1 || blocks.size(r) != blocks.size(r - 1)) {
            const WholeBuffer whole(blocks.size(r), blocks.fillersOf(r), mistakes);
            buffer = whole.limited(bufferSizeOf(itsFormat, mistakes, blocks.count, whole.size()));
        }
        const auto size = static_cast<unsigned>(buffer.places.size());
        for (std::size_t i = 0; i < itsKnown.size(); ++i) {
            const Row word = inOrder(itsKnown[i].codeWords[r], buffer.places);
            for (std::size_t t = 0; t < received[i].size(); ++t) {
                for (unsigned version = 0; version < link::redundancyVersions; ++version) {
                    tally.sums[t].at(version) += agreementAround(
                        &received[i][t][parts[r].first], parts[r].count, word.data(), size, buffer.starts.at(version));
                }
            }
        }
    }
    return tally;
}

/// Chooses the redundancy versions, another than said only where the signs call for it.
ChainSuspicion ChainEvidence::judged(const Tally& tally, double weight) const
{
    ChainSuspicion suspicion = {tally.mistakes, {}};
    std::vector<unsigned> versions = itsFormat.versions;
    long long sum = 0;
    for (std::size_t t = 0; t < versions.size(); ++t) {
        const auto& sums = tally.sums[t];
        const auto* const best = std::max_element(sums.begin(), sums.end());
        if (weight * static_cast<double>(*best - sums.at(versions[t])) / 2 > enoughForVersion) {
            versions[t] = static_cast<unsigned>(best - sums.begin());
        }
        sum += sums.at(versions[t]);
    }
    if (versions != itsFormat.versions) {
        suspicion.mistakes.versions = versions;
    }
    suspicion.signs = signsOf(sum);
    return suspicion;
}

std::vector<ChainSuspicion> ChainEvidence::suspicions() const
{
    std::vector<ChainMistakes> all = {{}};
    for (const bool inPairs : {false, true}) {
        const std::vector<ChainMistakes> some = combinationsOf(kindsOfMistakes(itsFormat), inPairs);
        all.insert(all.end(), some.begin(), some.end());
    }
    std::vector<Tally> tallies;
    long long most = 0;
    for (const ChainMistakes& mistakes : all) {
        tallies.push_back(tallied(mistakes));
        long long sum = 0;
        for (const auto& sums : tallies.back().sums) {
            sum += *std::max_element(sums.begin(), sums.end());
        }
        most = std::max(most, sum);
    }
    std::vector<ChainSuspicion> found;
    found.reserve(tallies.size());
    for (const Tally& tally : tallies) {
        found.push_back(judged(tally, weightOf(signsOf(most))));
    }
    return found;
}

ChainSuspicion ChainEvidence::asTold() const
{
    const Tally tally = tallied({});
    long long sum = 0;
    for (std::size_t t = 0; t < tally.sums.size(); ++t) {
        sum += tally.sums[t].at(itsFormat.versions[t]);
    }
    return {{}, signsOf(sum)};
}

/// The size of a circular buffer (N_cb) with which the first code block of the first transport block agrees best.
BufferSize ChainEvidence::bestBuffer(const ChainSuspicion& suspicion) const
{
    const ChainMistakes& mistakes = suspicion.mistakes;
    const std::vector<unsigned>& versions = mistakes.versions.empty() ? itsFormat.versions : mistakes.versions;
    const WholeBuffer whole(itsCode.blocks().size(0), itsCode.blocks().fillersOf(0), mistakes);
    const Part part = partsOf(itsCode, mistakes.split).front();
    const Row word = inOrder(itsKnown.front().codeWords.front(), whole.places());
    std::vector<Row> rows;
    for (const Row& row : itsKnown.front().rows) {
        rows.push_back(restoredSymbols(row, itsFormat.modulation, mistakes));
    }
    const auto agreementWith = [&](unsigned size) {
        const auto starts = whole.starts(size);
        long long sum = 0;
        for (std::size_t t = 0; t < rows.size(); ++t) {
            sum += agreementAround(
                &rows[t][part.first], part.count, word.data(), whole.bits(size), starts.at(versions[t]));
        }
        return sum;
    };
    std::vector<long long> agreements(whole.size() + 1, std::numeric_limits<long long>::min());
    for (unsigned size = whole.leastSize(); size <= whole.size(); ++size) {
        const bool isSame = size > whole.leastSize() && whole.bits(size) == whole.bits(size - 1) &&
                            whole.starts(size) == whole.starts(size - 1);
        agreements[size] = isSame ? agreements[size - 1] : agreementWith(size);
    }
    const auto best = std::max_element(agreements.begin(), agreements.end());
    const auto all = static_cast<double>(rows.size() * part.count);
    const double weight = weightOf({(all - static_cast<double>(*best)) / 2, all});
    const auto least = *best - static_cast<long long>(2 * (tellingApart + moreForBuffer) / weight);
    const auto isWorse = [least](long long each) {
        return each < least;
    };
    const auto from = std::find_if(std::make_reverse_iterator(best), agreements.rend(), isWorse).base();
    const auto to = std::find_if(best, agreements.end(), isWorse) - 1;
    const auto sizeAt = [&agreements](auto place) {
        return static_cast<unsigned>(place - agreements.begin());
    };
    return {sizeAt(best), sizeAt(from), sizeAt(to)};
}

ChainSuspicion ChainEvidence::withBuffer(const ChainSuspicion& suspicion) const
{
    const link::CodeBlocks& blocks = itsCode.blocks();
    const BufferSize size = bestBuffer(suspicion);
    const unsigned said = bufferSizeOf(
        itsFormat, {}, blocks.count, WholeBuffer(blocks.size(0), blocks.fillersOf(0), suspicion.mistakes).size());
    if (size.from <= said && said <= size.to) {
        return suspicion;
    }
    ChainSuspicion found = suspicion;
    found.mistakes.bufferSize = size;
    Tally tally = tallied(found.mistakes);
    tally.mistakes.versions.clear();
    return judged(tally, weightOf(suspicion.signs));
}

std::vector<AgreeingValue> agreeingValues(const ChainFormat& format,
                                          const std::vector<ChainCase>& cases,
                                          const ChainMistakes& mistakes)
{
    const link::TransportBlockCode code(codingOf(format));
    const link::CodeBlocks& blocks = code.blocks();
    const std::vector<Part> parts = partsOf(code, mistakes.split);
    const std::vector<unsigned>& versions = mistakes.versions.empty() ? format.versions : mistakes.versions;
    std::vector<AgreeingValue> values;
    for (const ChainCase& each : cases) {
        if (each.sent.empty() || values.size() >= enoughValues) {
            continue;
        }
        const auto words = codeWordsOf(code, each.sent);
        for (unsigned r = 0; r < blocks.count; ++r) {
            const WholeBuffer whole(blocks.size(r), blocks.fillersOf(r), mistakes);
            const CircularBuffer buffer = whole.limited(bufferSizeOf(format, mistakes, blocks.count, whole.size()));
            const unsigned length = blocks.size(r) + rules::tailPositions;
            for (unsigned t = 0; t < each.rows.size() && !buffer.places.empty(); ++t) {
                const std::vector<float> row = restoredSymbols(each.rows[t], format.modulation, mistakes);
                for (unsigned i = 0; i < parts[r].count; ++i) {
                    const unsigned bit = buffer.places[(buffer.starts.at(versions[t]) + i) % buffer.places.size()];
                    const auto eighth = static_cast<unsigned>(std::uint64_t{8} * i / parts[r].count);
                    const float value = row[parts[r].first + i] * static_cast<float>(words[r][bit]);
                    const unsigned stream = bit % length < blocks.size(r) ? bit / length : 3;
                    values.push_back({value, stream, t, r, i % bitsPerSymbol(format.modulation), eighth});
                }
            }
        }
    }
    return values;
}

Strength strengthOf(const std::vector<AgreeingValue>& values)
{
    constexpr std::ptrdiff_t fewest = 20;
    Strength strength;
    for (const AgreeingValue& each : values) {
        strength.meanAmplitude += std::abs(static_cast<double>(each.value)) / static_cast<double>(values.size());
    }
    const auto wrong = std::count_if(values.begin(), values.end(), [](const auto& each) { return each.value < 0; });
    if (wrong < fewest || strength.meanAmplitude <= 0) {
        return strength;
    }
    // A ratio x is wrong with probability 1 / (1 + e^x): the factor that makes the values ratios is the likeliest one.
    const auto slope = [&values](double factor) {
        double sum = 0;
        for (const AgreeingValue& each : values) {
            sum += each.value / (1 + std::exp(factor * each.value));
        }
        return sum;
    };
    double low = 1e-3 / strength.meanAmplitude;
    double high = 1e3 / strength.meanAmplitude;
    constexpr unsigned halvings = 30;
    for (unsigned i = 0; i < halvings; ++i) {
        const double middle = std::sqrt(low * high);
        (slope(middle) > 0 ? low : high) = middle;
    }
    strength.unit = 1 / low;
    strength.wrong = static_cast<double>(wrong) / static_cast<double>(values.size());
    for (const AgreeingValue& each : values) {
        strength.promised += 1 / (1 + std::exp(low * std::abs(each.value))) / static_cast<double>(values.size());
    }
    return strength;
}

}  // namespace morvik::diagnosis
