// Situations: what the arithmetic of a core can meet on a block: clips, wraps, ties, corrections, borders and cuts.
#include "Situations.h"

#include <algorithm>
#include <cstddef>
#include <set>
#include <utility>

#include "rules/Algorithms.h"
#include "rules/BlockSizes.h"

namespace morvik::coverage {

namespace {

/// A word of a name, and what stands for it in the sentence.
struct Word {
    std::string name;
    std::string text;
};

using Words = std::vector<Word>;

/// What a core must have to meet a family.
enum class Needs : std::uint8_t { nothing, scale, table, cut };

/// In name and text, % stands for a word of the first list, then of the second.
struct Description {
    Family family;
    unsigned rule;
    Needs needs;
    std::string name;
    std::string text;
    Words first = Words(1);
    Words second = Words(1);
};

/// Words that are the same in name and text.
Words plain(const std::vector<std::string>& texts)
{
    Words words;
    for (const std::string& text : texts) {
        words.push_back({text, text});
    }
    return words;
}

const Words ends = {{"above", "above 2047"}, {"below", "below -2048"}};
const Words limits = {{"above", "above 127"}, {"below", "below -128"}};
const Words signs = plain({"positive", "negative"});
const Words states = plain({"0", "1", "2", "3", "4", "5", "6", "7"});
const Words kernels = {
    {"forward", "forward recursion"}, {"backward", "backward recursion"}, {"ratio", "tree of a ratio"}};
const Words candidates = {{"one.above", "plus a branch metric exceeds 2047"},
                          {"one.below", "plus a branch metric falls below -2048"},
                          {"zero.above", "minus a branch metric exceeds 2047"},
                          {"zero.below", "minus a branch metric falls below -2048"}};

/// The decisions of a ratio's tree, numbered as a binary heap.
const Words nodes = {{"last", "the two halves"},
                     {"half0", "pairs 0 and 1"},
                     {"half1", "pairs 2 and 3"},
                     {"pair0", "states 0 and 1"},
                     {"pair1", "states 2 and 3"},
                     {"pair2", "states 4 and 5"},
                     {"pair3", "states 6 and 7"}};

/// The entries of the table that are not 0, each for four differences.
const Words entries = {{"0.positive", "0 to 3"},
                       {"0.negative", "-1 to -4"},
                       {"1.positive", "4 to 7"},
                       {"1.negative", "-5 to -8"},
                       {"2.positive", "8 to 11"},
                       {"2.negative", "-9 to -12"},
                       {"3.positive", "12 to 15"},
                       {"3.negative", "-13 to -16"},
                       {"4.positive", "16 to 19"},
                       {"4.negative", "-17 to -20"},
                       {"5.positive", "20 to 23"},
                       {"5.negative", "-21 to -24"}};

Words algorithms()
{
    Words words;
    for (const std::string_view name : rules::algorithmNames) {
        words.push_back({std::string(name), std::string(name)});
    }
    return words;
}

/// In the order of Family.
std::vector<Description> ofArithmetic()
{
    using F = Family;
    using N = Needs;
    return {
        {F::wrapOfSum, 2, N::nothing, "wrap.sum.%", "Forward plus backward metric is % and wraps", ends},
        {F::wrapOfBranch, 2, N::nothing, "wrap.%.%", "In the %, a metric % and wraps", kernels, candidates},
        {F::wrapOfDifference, 2, N::nothing, "wrap.difference.%", "A ratio's difference is % and wraps", ends},
        {F::wrapOfPending, 2, N::table, "wrap.pending.%", "In the %, a pending correction wraps a metric", kernels},
        {F::wrapOfCompare,
         3,
         N::nothing,
         "compare.%.%",
         "In the %, the difference of two candidates is %: without wrapping, the other one is greater",
         kernels,
         ends},
        {F::tieForward, 3, N::nothing, "tie.forward.%", "The forward candidates for state % are equal", states},
        {F::tieBackward, 3, N::nothing, "tie.backward.%", "The backward candidates for state % are equal", states},
        {F::tieRatio,
         3,
         N::nothing,
         "tie.ratio.%.%",
         "In the tree of a ratio, for bit %, the candidates of % are equal",
         {{"one", "1"}, {"zero", "0"}},
         nodes},
        {F::input,
         4,
         N::nothing,
         "input.%.%",
         "A soft value of % is %",
         {{"systematic", "the systematic stream"}, {"parity", "a parity stream"}, {"tail", "the tail"}},
         {{"highest", "127"}, {"lowest", "-128"}}},
        {F::branchClip,
         5,
         N::nothing,
         "branch.%.%",
         "Branch metrics % are clipped, as their sum is %",
         {{"g0", "g0 and g3"}, {"g1", "g1 and g2"}},
         limits},
        {F::branchNegated, 5, N::nothing, "branch.negated", "A parity value of -128 is subtracted"},
        {F::algorithm, 7, N::cut, "core.%", "A core of the algorithm %", algorithms()},
        {F::pendingTie,
         7,
         N::table,
         "pending.tie.%",
         "In the %, equal candidates carry different corrections",
         kernels},
        {F::correction,
         9,
         N::table,
         "table.%.%",
         "In the %, a decision is corrected for a difference of %",
         kernels,
         entries},
        {F::noCorrection, 9, N::table, "table.%.none", "In the %, a difference is beyond the table", kernels},
        {F::inverted,
         9,
         N::table,
         "table.%.inverted",
         "In the %, a negative difference has another correction than the positive one, as its magnitude is one less",
         kernels},
        {F::border,
         11,
         N::nothing,
         "border.%.%",
         "In a border column of the %, a % metric loses low bits",
         {{"forward", "forward recursion"}, {"backward", "backward recursion"}, {"tail", "tail"}},
         signs},
    };
}

std::vector<Description> ofPassesAndCuts()
{
    using F = Family;
    using N = Needs;
    return {
        {F::tailSum, 12, N::nothing, "tail.sum.%", "A branch sum of the tail is %, and not clipped", limits},
        {F::tailState,
         12,
         N::nothing,
         "tail.%.%",
         "The tail of the % encoder favours state %",
         {{"natural", "first"}, {"interleaved", "second"}},
         states},
        {F::intrinsicWide, 13, N::nothing, "intrinsic.wide.%", "Twice the intrinsic value is %", limits},
        {F::aprioriOdd, 13, N::nothing, "intrinsic.odd.%", "Half a % a-priori value is rounded down", signs},
        {F::intrinsicHalf, 13, N::nothing, "intrinsic.half.%", "A % intrinsic value ends in half an eighth", signs},
        {F::extrinsicClip, 14, N::nothing, "extrinsic.%", "An extrinsic value is clipped, as it is %", limits},
        {F::scaledInside,
         14,
         N::scale,
         "extrinsic.inside.%",
         "An extrinsic value is % before it is scaled, not after",
         limits},
        {F::scaledRounded, 14, N::scale, "extrinsic.rounded.%", "A % scaled value is rounded down to an eighth", signs},
        {F::pass,
         15,
         N::nothing,
         "pass.%.%",
         "The % half-iteration over the % code",
         {{"first", "first"}, {"later", "second or a later"}},
         {{"natural", "natural"}, {"interleaved", "interleaved"}}},
        {F::size, 15, N::cut, "size.%", "A block of % bits", plain({"40", "6144"})},
        {F::decision,
         16,
         N::nothing,
         "decision.%",
         "A ratio of the last half-iteration is %",
         {{"zero", "0, which decides for 1"}, {"one", "positive"}, {"none", "negative"}}},
        {F::units, 17, N::cut, "core.%", "A core of % units", {{"2_units", "2"}, {"4_units", "4"}, {"8_units", "8"}}},
        {F::segments, 17, N::cut, "segments.%", "Segments of a block: %", plain({"1", "2", "4", "8", "16", "32"})},
        {F::unitsAtWork, 17, N::cut, "units.%", "Units that work on a block: %", plain({"1", "2", "4", "8"})},
        {F::window,
         18,
         N::cut,
         "window.%",
         "A window of %",
         {{"full", "64 steps"},
          {"half", "33 to 63 steps, half of what remained of a segment"},
          {"short", "40 to 63 steps, a whole block"}}},
        {F::rows,
         18,
         N::cut,
         "rows.%",
         "Windows of a segment: %",
         {{"1", "1"}, {"2", "2"}, {"3", "3"}, {"more", "4 or more"}}},
        {F::startForward,
         19,
         N::nothing,
         "start.forward.%",
         "A segment starts from %",
         {{"known", "the known state"},
          {"unknown", "the unknown state"},
          {"kept", "a column of the last pass over the code"}}},
        {F::startBackward,
         20,
         N::nothing,
         "start.backward.%",
         "A window starts from %",
         {{"tail", "the tail's column"},
          {"unknown", "the unknown state"},
          {"kept", "a column of the last pass over the code"},
          {"fresh", "a column of the same pass"}}},
    };
}

const std::vector<Description>& descriptions()
{
    static const std::vector<Description> all = [] {
        std::vector<Description> joined = ofArithmetic();
        for (Description& each : ofPassesAndCuts()) {
            joined.push_back(std::move(each));
        }
        return joined;
    }();
    return all;
}

/// How the members of a family are numbered: the second word runs faster.
struct Numbering {
    unsigned start;
    unsigned stride;  ///< of the first word
};

std::vector<Numbering> numberings()
{
    std::vector<Numbering> numbers;
    unsigned next = 0;
    for (const Description& each : descriptions()) {
        const auto stride = static_cast<unsigned>(each.second.size());
        numbers.push_back({next, stride});
        next += static_cast<unsigned>(each.first.size()) * stride;
    }
    return numbers;
}

/// Puts the words in the places of %.
std::string filled(std::string text, const std::string& first, const std::string& second)
{
    std::size_t place = 0;
    for (const std::string& word : {first, second}) {
        place = text.find('%', place);
        if (place == std::string::npos) {
            break;
        }
        text.replace(place, 1, word);
        place += word.size();
    }
    return text;
}

std::vector<Situation> allSituations()
{
    std::vector<Situation> all;
    for (const Description& each : descriptions()) {
        for (const Word& first : each.first) {
            for (const Word& second : each.second) {
                all.push_back({filled(each.name, first.name, second.name),
                               filled(each.text, first.text, second.text),
                               each.rule,
                               each.family});
            }
        }
    }
    return all;
}

/// Which of few cases a power of two stands for: 0 for 1, 1 for 2, 2 for 4.
unsigned log2Of(unsigned power)
{
    unsigned log2 = 0;
    while (power >> log2 > 1) {
        ++log2;
    }
    return log2;
}

/// What the core meets in blocks of all sizes.
std::set<unsigned> ofAllCuts(const Core& core)
{
    std::set<unsigned> met;
    for (const rules::BlockSize& size : rules::blockSizes) {
        forEachOfCut(rules::Cut(size.K, core.units), core.algorithm, [&met](unsigned number) { met.insert(number); });
    }
    return met;
}

}  // namespace

unsigned situation(Family family, unsigned first, unsigned second)
{
    static const std::vector<Numbering> all = numberings();
    const Numbering& numbering = all[static_cast<std::size_t>(family)];
    return numbering.start + first * numbering.stride + second;
}

const std::vector<Situation>& situations()
{
    static const std::vector<Situation> all = allSituations();
    return all;
}

std::vector<unsigned> situationsNamed(std::string_view name)
{
    std::vector<unsigned> numbers;
    for (unsigned number = 0; number < situations().size(); ++number) {
        const std::string& each = situations()[number].name;
        const bool begins = each.compare(0, name.size(), name) == 0;
        if (name == "all" || (begins && (each.size() == name.size() || each[name.size()] == '.'))) {
            numbers.push_back(number);
        }
    }
    return numbers;
}

Core coreOf(const veltra_ip_morvik_v1_0_generics& generics)
{
    return {static_cast<unsigned>(generics.C_NUM_PU), static_cast<unsigned>(generics.C_ALGORITHM_TYPE)};
}

std::optional<std::string> whyImpossible(unsigned situation, const Core& core)
{
    const Description& description = descriptions()[static_cast<std::size_t>(situations()[situation].family)];
    const std::string algorithm(rules::algorithmNames.at(core.algorithm));
    switch (description.needs) {
    case Needs::scale:
        return core.algorithm == 1 ? std::nullopt : std::optional(algorithm + " does not scale");
    case Needs::table:
        return core.algorithm == 2 ? std::nullopt : std::optional(algorithm + " has no table");
    case Needs::nothing:
        return std::nullopt;
    case Needs::cut:
        break;
    }
    if (ofAllCuts(core).count(situation) > 0) {
        return std::nullopt;
    }
    const bool isOfCore = description.family == Family::units || description.family == Family::algorithm;
    return isOfCore ? "the core is another one" : "no block size gives it on " + std::to_string(core.units) + " units";
}

void forEachOfCut(const rules::Cut& cut, unsigned algorithm, const std::function<void(unsigned)>& take)
{
    take(situation(Family::algorithm, algorithm));
    take(situation(Family::units, log2Of(cut.units()) - 1));
    if (cut.K() == rules::blockSizes.front().K || cut.K() == rules::blockSizes.back().K) {
        take(situation(Family::size, cut.K() == rules::blockSizes.front().K ? 0 : 1));
    }
    take(situation(Family::segments, log2Of(cut.segments())));
    take(situation(Family::unitsAtWork, log2Of(cut.unitsAtWork())));
    std::set<unsigned> windows;
    for (unsigned row = 0; row < cut.rows(); ++row) {
        const bool isFull = cut.windowLength(row) == rules::longestWindow;
        windows.insert(isFull ? 0 : cut.rows() > 1 ? 1 : 2);
    }
    for (const unsigned kind : windows) {
        take(situation(Family::window, kind));
    }
    constexpr unsigned mostRowsApart = 4;
    take(situation(Family::rows, std::min(cut.rows(), mostRowsApart) - 1));
}

}  // namespace morvik::coverage
