// ChainDiagnosis: why transport blocks do not decode into the bits that were sent.
#include "ChainDiagnosis.h"

#include <algorithm>
#include <array>
#include <cmath>
#include <utility>

#include "ChainTrial.h"
#include "link/RatioScale.h"

namespace morvik::diagnosis {

namespace {

/// Doublings by which a scale is off that counts as a mistake: where errors tell what the values mean, and where only
/// their amplitude does.
constexpr double enoughDoublings = 1;
constexpr double enoughByAmplitude = 3;
/// Wrong signs that ratios promise for each wrong one: about one in noise, more if strong values are wrong.
constexpr double contradictory = 1.3;
/// Decibels below Shannon's limit at which nobody would look for mistakes.
constexpr double hopeless = 6;
constexpr std::size_t likelyAttempts = 6;
constexpr std::size_t blocksTriedByCrc = 2;
constexpr std::uint32_t simulatedBlocks = 100;
/// If a smaller fraction of the simulated blocks fails, noise does not explain a failure.
constexpr double explainedFrom = 0.01;

/// Soft buffers for a transport block (N_IR) of user equipment: its soft channel bits by category (3GPP TS 36.306,
/// Table 4.1-1) for 8 processes, with one or two codewords.
constexpr std::array<unsigned, 6> usualBuffers = {
    250368 / 8, 1237248 / 16, 1827072 / 16, 1237248 / 8, 1827072 / 8, 3654144 / 8};

/// The mistakes that are tried where no bits are known, by kind.
std::vector<std::vector<ChainMistakes>> kindsToTry(const ChainFormat& format)
{
    std::vector<std::vector<ChainMistakes>> kinds = kindsOfMistakes(format);
    std::vector<ChainMistakes> versions(link::redundancyVersions);
    for (unsigned version = 0; version < versions.size(); ++version) {
        versions[version].versions = format.versions;
        versions[version].versions.front() = version;
    }
    kinds.insert(kinds.begin(), versions);
    const unsigned count = link::codeBlocksOf(format.bits).count;
    std::vector<ChainMistakes> buffers(1);
    buffers.front().bufferSize.best = link::unlimitedBuffer;
    for (const unsigned size : usualBuffers) {
        buffers.emplace_back();
        buffers.back().bufferSize.best = size / count;
    }
    kinds.push_back(buffers);
    kinds.emplace_back();
    for (const int doublings : {-6, -4, -2, 2, 4, 6}) {
        kinds.back().emplace_back();
        kinds.back().back().doublings = doublings;
    }
    return kinds;
}

class ChainExamination {
public:
    ChainExamination(std::vector<ChainCase> cases,
                     const ChainFormat& format,
                     const DecoderOptions& options,
                     double scale)
        : itsCases(std::move(cases)),
          itsFormat(format),
          itsOptions(options),
          itsScale(scale),
          itsTrial(format, options, scale)
    {
    }

    ChainDiagnosis run()
    {
        ChainDiagnosis diagnosis;
        diagnosis.format = itsFormat;
        diagnosis.blocks = itsCases.size();
        findBits();
        diagnosis.known = static_cast<std::size_t>(
            std::count_if(itsCases.begin(), itsCases.end(), [](const ChainCase& each) { return !each.sent.empty(); }));
        if (diagnosis.known == 0) {
            diagnosis.verdict = Verdict::unrelated;
            diagnosis.attempts = {{}};
            return diagnosis;
        }
        attemptAll(diagnosis);
        measure(diagnosis);
        dropNeedless(diagnosis);
        dropDoubtful(diagnosis);
        if (!diagnosis.nearest && !diagnosis.uneven) {
            tryScale(diagnosis);
        }
        judge(diagnosis);
        return diagnosis;
    }

private:
    /// The lower, the likelier.
    double cost(const ChainMistakes& mistakes, const Signs& signs, double eachMistake) const
    {
        return itsWeight * signs.wrong + eachMistake * mistakes.count(itsFormat) +
               (mistakes.bufferSize.best != 0 ? moreForBuffer : 0);
    }

    template <class Suspected>
    double cost(const Suspected& suspected, double eachMistake) const
    {
        return cost(suspected.mistakes, suspected.signs, eachMistake);
    }

    /// Takes the decisions of blocks whose CRC fits, once a mistake is undone if need be, for the bits that were sent.
    void findBits()
    {
        const bool isKnown =
            std::any_of(itsCases.begin(), itsCases.end(), [](const ChainCase& each) { return !each.sent.empty(); });
        if (isKnown || findBits({})) {
            return;
        }
        const std::vector<ChainCase> first(
            itsCases.begin(),
            itsCases.begin() + static_cast<std::ptrdiff_t>(std::min(itsCases.size(), blocksTriedByCrc)));
        for (const bool inPairs : {false, true}) {
            for (const ChainMistakes& mistakes : combinationsOf(kindsToTry(itsFormat), inPairs)) {
                const bool isLikely = std::any_of(first.begin(), first.end(), [&](const ChainCase& each) {
                    return itsTrial.fitsAtFirst(each, mistakes);
                });
                if (isLikely && findBits(mistakes)) {
                    return;
                }
            }
        }
    }

    bool findBits(const ChainMistakes& mistakes)
    {
        bool isFound = false;
        for (ChainCase& each : itsCases) {
            each.sent = itsTrial.bitsOf(each, mistakes);
            // The CRC of zeros fits: values without any order decode into them if their signs are chosen so.
            const bool hasOnes = std::count(each.sent.begin(), each.sent.end(), 1) > 0;
            if (mistakes.count(itsFormat) > 0 && !hasOnes) {
                each.sent.clear();
            }
            isFound = isFound || !each.sent.empty();
        }
        return isFound;
    }

    ChainAttempt attempt(const ChainMistakes& mistakes, const Signs& signs)
    {
        const ChainTrial::Result result = itsTrial.decode(itsCases, mistakes);
        return {mistakes, signs, result.decoded, result.wrongBits};
    }

    /// All suspicions, the likeliest first; that without mistakes apart.
    std::pair<ChainSuspicion, std::vector<ChainSuspicion>> suspicions()
    {
        const ChainEvidence evidence(itsFormat, itsCases);
        std::vector<ChainSuspicion> all = evidence.suspicions();
        const auto fewest = std::min_element(
            all.begin(), all.end(), [](const auto& a, const auto& b) { return a.signs.wrong < b.signs.wrong; });
        itsWeight = weightOf(fewest->signs);
        ChainSuspicion asIs = all.front();
        const auto byCost = [this](const ChainSuspicion& a, const ChainSuspicion& b) {
            return cost(a, enoughByItself) < cost(b, enoughByItself);
        };
        if (asIs.mistakes.count(itsFormat) == 0) {
            all.erase(all.begin());
        } else {
            asIs = evidence.asTold();
        }
        std::sort(all.begin(), all.end(), byCost);
        // With another soft buffer, alone, with each redundancy version, or beside the likeliest mistakes.
        std::vector<ChainSuspicion> withBuffers;
        for (unsigned version = 0; version < link::redundancyVersions; ++version) {
            ChainSuspicion other = asIs;
            other.mistakes.versions = itsFormat.versions;
            other.mistakes.versions.front() = version;
            withBuffers.push_back(evidence.withBuffer(other));
        }
        for (std::size_t i = 0; i < std::min<std::size_t>(all.size(), 2); ++i) {
            withBuffers.push_back(evidence.withBuffer(all[i]));
        }
        for (const ChainSuspicion& each : withBuffers) {
            if (each.mistakes.bufferSize.best != 0) {
                itsWeight = std::max(itsWeight, weightOf(each.signs));
                all.push_back(each);
            }
        }
        std::sort(all.begin(), all.end(), byCost);
        return {asIs, all};
    }

    void attemptAll(ChainDiagnosis& diagnosis)
    {
        const auto [asIs, all] = suspicions();
        diagnosis.attempts.push_back(attempt(asIs.mistakes, asIs.signs));
        for (std::size_t i = 0; i < std::min(all.size(), likelyAttempts); ++i) {
            diagnosis.attempts.push_back(attempt(all[i].mistakes, all[i].signs));
        }
        diagnosis.best = choose(diagnosis.attempts);
        const unsigned count = diagnosis.best.mistakes.count(itsFormat);
        for (const ChainSuspicion& each : all) {
            const bool isOther = explained(each.mistakes) != explained(diagnosis.best.mistakes);
            const bool hasBuffer = each.mistakes.bufferSize.best + diagnosis.best.mistakes.bufferSize.best != 0;
            if (count > 0 && isOther && each.mistakes.count(itsFormat) == count &&
                itsWeight * std::abs(each.signs.wrong - diagnosis.best.signs.wrong) <
                    tellingApart + (hasBuffer ? moreForBuffer : 0)) {
                diagnosis.equals.push_back(each.mistakes);
            }
        }
    }

    std::string explained(const ChainMistakes& mistakes) const
    {
        std::string text;
        for (const Explanation& each : explain(mistakes, itsFormat)) {
            text += each.what + '\n';
        }
        return text;
    }

    /// The likeliest attempt by the signs, or one that decodes more blocks and that the signs support as well.
    ChainAttempt choose(const std::vector<ChainAttempt>& attempts) const
    {
        ChainAttempt best = *std::min_element(attempts.begin(), attempts.end(), [this](const auto& a, const auto& b) {
            return cost(a, enoughByItself) < cost(b, enoughByItself);
        });
        for (const ChainAttempt& each : attempts) {
            if (each.decoded > best.decoded && cost(each, enoughWithDecoding) < cost(best, enoughWithDecoding)) {
                best = each;
            }
        }
        return best;
    }

    /// What the values say of their scale and of noise, once the likeliest mistakes are undone.
    void measure(ChainDiagnosis& diagnosis) const
    {
        const std::vector<AgreeingValue> values = agreeingValues(itsFormat, itsCases, diagnosis.best.mistakes);
        diagnosis.strength = strengthOf(values);
        diagnosis.uneven = unevenPart(values, diagnosis.strength.unit);
        const double rate =
            static_cast<double>(itsFormat.bits) / itsFormat.codedBits / static_cast<double>(itsFormat.versions.size());
        diagnosis.suitableSteps =
            link::ratioScale(itsOptions.generics.C_ALGORITHM_TYPE, itsFormat.modulation, std::min(rate, 1.0));
        diagnosis.steps = itsScale * diagnosis.strength.unit;
        diagnosis.isContradictory = diagnosis.strength.promised > contradictory * diagnosis.strength.wrong;
    }

    /// Drops single mistakes without which as many blocks decode, if noise does not explain what they leave.
    void dropNeedless(ChainDiagnosis& diagnosis)
    {
        if (!diagnosis.uneven || diagnosis.best.decoded <= diagnosis.attempts.front().decoded) {
            return;
        }
        for (bool isDropped = true; isDropped;) {
            isDropped = false;
            for (const ChainMistakes& fewer : withoutOne(diagnosis.best.mistakes, itsFormat)) {
                const ChainAttempt tried = attempt(fewer, signsOfAll(agreeingValues(itsFormat, itsCases, fewer)));
                if (tried.decoded >= diagnosis.best.decoded) {
                    diagnosis.best = tried;
                    diagnosis.attempts.push_back(tried);
                    diagnosis.equals.clear();
                    isDropped = true;
                    break;
                }
            }
        }
        measure(diagnosis);
    }

    /// Drops mistakes that no block decodes without, if noise does not explain what they leave.
    void dropDoubtful(ChainDiagnosis& diagnosis) const
    {
        const ChainAttempt& asIs = diagnosis.attempts.front();
        if (diagnosis.best.mistakes.count(itsFormat) == 0 || diagnosis.best.decoded > asIs.decoded) {
            return;
        }
        const NearMiss miss = {
            diagnosis.best, esn0Of(itsFormat.modulation, diagnosis.best.signs.fraction()), limitOf(itsFormat)};
        if (diagnosis.uneven || diagnosis.isContradictory || miss.esn0 < miss.limit - hopeless) {
            diagnosis.nearest = miss;
            diagnosis.best = asIs;
            diagnosis.equals.clear();
        }
    }

    /// Tries a scale that is off by a power of two. It is a mistake if it keeps blocks from decoding.
    void tryScale(ChainDiagnosis& diagnosis)
    {
        const double excess = diagnosis.steps > 0 ? diagnosis.steps / diagnosis.suitableSteps
                                                  : itsScale * diagnosis.strength.meanAmplitude / 8;
        if (diagnosis.best.signs.certainty() < related || excess <= 0) {
            return;
        }
        const double doublings = std::clamp(std::log2(excess), -60.0, 60.0);
        if (std::abs(doublings) < (diagnosis.steps > 0 ? enoughDoublings : enoughByAmplitude)) {
            return;
        }
        ChainMistakes mistakes = diagnosis.best.mistakes;
        mistakes.doublings = static_cast<int>(std::lround(doublings));
        const ChainAttempt tried = attempt(mistakes, diagnosis.best.signs);
        diagnosis.attempts.push_back(tried);
        if (tried.decoded > diagnosis.best.decoded &&
            (tried.decoded == diagnosis.blocks || !diagnosis.isContradictory)) {
            diagnosis.best = tried;
        }
    }

    void judge(ChainDiagnosis& diagnosis)
    {
        const std::size_t asIs = diagnosis.attempts.front().decoded;
        const Signs& signs = diagnosis.nearest ? diagnosis.nearest->attempt.signs : diagnosis.best.signs;
        if (signs.certainty() < related) {
            diagnosis.verdict = Verdict::unrelated;
        } else if (asIs == diagnosis.blocks) {
            diagnosis.verdict = diagnosis.best.mistakes.count(itsFormat) > 0 ? Verdict::careless : Verdict::healthy;
        } else if (diagnosis.best.decoded == diagnosis.blocks) {
            diagnosis.verdict = Verdict::mistaken;
        } else if (diagnosis.nearest || diagnosis.uneven || diagnosis.isContradictory) {
            diagnosis.verdict = Verdict::unexplained;
        } else {
            ChainNoise noise;
            noise.esn0 = esn0Of(itsFormat.modulation, diagnosis.best.signs.fraction());
            noise.simulated = simulatedBlocks;
            noise.failed = simulatedFailures(itsFormat, itsOptions, noise.esn0, diagnosis.steps, simulatedBlocks);
            diagnosis.noise = noise;
            diagnosis.verdict = noise.failed >= explainedFrom * noise.simulated ? Verdict::noisy : Verdict::unexplained;
        }
    }

    std::vector<ChainCase> itsCases;
    const ChainFormat& itsFormat;
    const DecoderOptions& itsOptions;
    double itsScale;
    ChainTrial itsTrial;
    double itsWeight = 1;
};

}  // namespace

ChainDiagnosis diagnose(std::vector<ChainCase> cases,
                        const ChainFormat& format,
                        const DecoderOptions& options,
                        double scale)
{
    return ChainExamination(std::move(cases), format, options, scale).run();
}

}  // namespace morvik::diagnosis
