// Diagnosis: why blocks do not decode into the bits that were sent.
#include "Diagnosis.h"

#include <algorithm>
#include <cmath>
#include <tuple>

#include "Trial.h"
#include "rules/Tail.h"

namespace morvik::diagnosis {

namespace {

/// Standard deviations by which signs must beat chance where blocks are decoded. With even fewer, decoding proves
/// nothing: soft values of 0 decode into ones. Where a block of 40 bits just decodes, its signs beat chance by some 6.
constexpr double meaningful = 3;
constexpr std::size_t likelyAttempts = 8;
constexpr std::uint32_t simulatedBlocks = 400;
/// If a smaller fraction of the simulated blocks fails, noise does not explain a failure.
constexpr double explainedFrom = 0.005;

std::vector<Case> allUndone(const std::vector<Case>& cases, const Mistakes& mistakes)
{
    std::vector<Case> right;
    right.reserve(cases.size());
    for (const Case& block : cases) {
        right.push_back(undone(block, mistakes));
    }
    return right;
}

/// Log odds of belonging to the bits, comparable across numbers of values: values left out count as chance.
double netOdds(const Suspicion& suspicion)
{
    return suspicion.signs.odds() - enoughByItself * suspicion.mistakes.count();
}

/// A stream whose signs chance explains far better than the error rate of the others.
std::optional<std::size_t> strangerOf(const Appearance& appearance)
{
    for (std::size_t stream = 0; stream < appearance.streams.size(); ++stream) {
        const Signs others = appearance.others(stream);
        if (others.certainty() > related && appearance.streams[stream].odds(others.fraction()) < -enoughByItself) {
            return stream;
        }
    }
    return std::nullopt;
}

class Examination {
public:
    Examination(const std::vector<Case>& cases, const DecoderOptions& options)
        : itsCases(cases), itsOptions(options), itsTrial(options), itsSuspicions(suspicions(cases))
    {
        const auto fewest =
            std::min_element(itsSuspicions.begin(), itsSuspicions.end(), [](const auto& a, const auto& b) {
                return a.signs.wrong < b.signs.wrong;
            });
        itsWeight = weightOf(fewest->signs);
        std::sort(itsSuspicions.begin(), itsSuspicions.end(), [this](const auto& a, const auto& b) {
            return cost(a, enoughByItself) < cost(b, enoughByItself);
        });
    }

    Diagnosis run()
    {
        Diagnosis diagnosis;
        diagnosis.blocks = itsCases.size();
        attemptAll(diagnosis);
        const Attempt asIs = diagnosis.attempts.front();
        diagnosis.best = choose(diagnosis.attempts);
        if (diagnosis.best.decoded == 0) {
            trySmallerSizes(diagnosis);
        }
        tryScale(diagnosis);
        diagnosis.appearance = appearanceOf(allUndone(itsCases, diagnosis.best.mistakes));
        diagnosis.stranger = strangerOf(diagnosis.appearance);
        diagnosis.clipped = valuesThat([](std::int32_t value) { return value < -128 || value > 127; });
        diagnosis.hasNegative = valuesThat([](std::int32_t value) { return value < 0; }) > 0;
        judge(asIs, diagnosis);
        return diagnosis;
    }

private:
    /// The lower, the likelier.
    double cost(const Suspicion& suspicion, double eachMistake) const
    {
        return itsWeight * suspicion.signs.wrong + eachMistake * suspicion.mistakes.count();
    }

    double cost(const Attempt& attempt, double eachMistake) const
    {
        return cost(Suspicion{attempt.mistakes, attempt.signs}, eachMistake);
    }

    Attempt attempt(const Suspicion& suspicion)
    {
        const Trial::Result result = itsTrial.decode(allUndone(itsCases, suspicion.mistakes));
        return {suspicion.mistakes, suspicion.signs, true, result.decoded, result.wrongBits};
    }

    bool areRowsRight() const
    {
        return std::all_of(itsCases.begin(), itsCases.end(), [](const Case& block) {
            return block.received.size() == block.sent.size() + rules::tailPositions;
        });
    }

    void attemptAll(Diagnosis& diagnosis)
    {
        std::size_t likely = 0;
        for (const Suspicion& suspicion : itsSuspicions) {
            if (suspicion.mistakes.count() <= 1 || likely < likelyAttempts) {
                diagnosis.attempts.push_back(attempt(suspicion));
                ++likely;
            }
        }
        Attempt asIs;
        const auto found = std::find_if(diagnosis.attempts.begin(), diagnosis.attempts.end(), [](const Attempt& each) {
            return each.mistakes.count() == 0;
        });
        if (found != diagnosis.attempts.end()) {
            std::rotate(diagnosis.attempts.begin(), found, found + 1);
        } else {
            asIs.decodable = areRowsRight();
            diagnosis.attempts.insert(diagnosis.attempts.begin(), asIs);
        }
    }

    /// The likeliest attempt by the signs, or one that decodes more blocks and that the signs support as well.
    Attempt choose(const std::vector<Attempt>& attempts) const
    {
        Attempt likeliest;
        double least = HUGE_VAL;
        for (const Attempt& each : attempts) {
            if (each.decodable && cost(each, enoughByItself) < least) {
                least = cost(each, enoughByItself);
                likeliest = each;
            }
        }
        const auto order = [this](const Attempt& one) {
            return std::make_tuple(-static_cast<double>(one.decoded), cost(one, enoughWithDecoding));
        };
        Attempt best = likeliest;
        for (const Attempt& each : attempts) {
            const bool isBacked =
                each.mistakes.count() == 0 || cost(each, enoughWithDecoding) < cost(likeliest, enoughWithDecoding);
            if (each.decodable && isBacked && each.decoded > likeliest.decoded && order(each) < order(best)) {
                best = each;
            }
        }
        return best;
    }

    /// Tries blocks padded at the end, like their reference.
    void trySmallerSizes(Diagnosis& diagnosis)
    {
        const std::size_t K = itsCases.front().sent.size();
        const bool isOneSize =
            std::all_of(itsCases.begin(), itsCases.end(), [K](const Case& block) { return block.sent.size() == K; });
        if (!isOneSize || !areRowsRight()) {
            return;
        }
        std::vector<Suspicion> found = suspicionsOfSmallerSizes(itsCases);
        std::sort(found.begin(), found.end(), [](const auto& a, const auto& b) { return netOdds(a) > netOdds(b); });
        found.resize(std::min(found.size(), likelyAttempts));
        for (const Suspicion& suspicion : found) {
            const bool isLikelier = netOdds(suspicion) > netOdds({diagnosis.best.mistakes, diagnosis.best.signs});
            const Attempt tried = attempt(suspicion);
            diagnosis.attempts.push_back(tried);
            if (isLikelier && tried.decoded > diagnosis.best.decoded) {
                diagnosis.best = tried;
            }
        }
    }

    /// Tries a scale that is off by a power of two. It is a mistake if it keeps blocks from decoding.
    void tryScale(Diagnosis& diagnosis)
    {
        const Appearance appearance = appearanceOf(allUndone(itsCases, diagnosis.best.mistakes));
        const double variance = appearance.power - appearance.amplitude * appearance.amplitude;
        if (appearance.all().certainty() < related || appearance.amplitude <= 0) {
            return;
        }
        // Types 0 and 1 do well with any amplitude around 8; type 2 needs 8 / variance for amplitude 1.
        const bool isExact = itsOptions.generics.C_ALGORITHM_TYPE == 2 && variance > 0;
        const double suitable = isExact ? 8 * appearance.amplitude * appearance.amplitude / variance : 8;
        const int doublings = static_cast<int>(std::lround(std::log2(appearance.amplitude / suitable)));
        if (doublings == 0) {
            return;
        }
        Suspicion suspicion{diagnosis.best.mistakes, diagnosis.best.signs};
        suspicion.mistakes.doublings = doublings;
        const Attempt tried = attempt(suspicion);
        diagnosis.attempts.push_back(tried);
        if (tried.decoded > diagnosis.best.decoded) {
            diagnosis.best = tried;
        }
    }

    template <class Condition>
    std::uint64_t valuesThat(Condition condition) const
    {
        std::uint64_t count = 0;
        for (const Case& block : itsCases) {
            for (const auto* stream : {&block.received.rsc1Sys, &block.received.rsc1Par, &block.received.rsc2Par}) {
                count += static_cast<std::uint64_t>(std::count_if(stream->begin(), stream->end(), condition));
            }
        }
        return count;
    }

    void judge(const Attempt& asIs, Diagnosis& diagnosis)
    {
        const bool isMistaken = diagnosis.best.mistakes.count() > 0;
        const bool isDecoded = asIs.decoded == diagnosis.blocks || diagnosis.best.decoded == diagnosis.blocks;
        if (diagnosis.appearance.all().certainty() < (isDecoded ? meaningful : related)) {
            diagnosis.verdict = Verdict::unrelated;
        } else if (asIs.decoded == diagnosis.blocks) {
            diagnosis.verdict = isMistaken ? Verdict::careless : Verdict::healthy;
        } else if (isDecoded) {
            diagnosis.verdict = Verdict::mistaken;
        } else if (diagnosis.stranger) {
            diagnosis.verdict = Verdict::strange;
        } else {
            diagnosis.noise = noiseOf(diagnosis);
            const bool isExplained = diagnosis.noise->failed >= explainedFrom * diagnosis.noise->simulated;
            diagnosis.verdict = isExplained ? Verdict::noisy : Verdict::unexplained;
        }
    }

    /// Estimates the noise from amplitude and variance; the tail counts as in `morvik ber`.
    Noise noiseOf(const Diagnosis& diagnosis)
    {
        Noise noise;
        noise.blockSize = itsTrial.decode(allUndone(itsCases, diagnosis.best.mistakes)).failedSize;
        const auto K = static_cast<double>(noise.blockSize);
        const double amplitude = std::max(diagnosis.appearance.amplitude, 1e-3);
        const double variance = std::max(diagnosis.appearance.power - amplitude * amplitude, 1e-3);
        noise.ebn0 = 10 * std::log10((3 * K + rules::tailValues) / (2 * K) * amplitude * amplitude / variance);
        noise.simulated = simulatedBlocks;
        noise.failed = simulatedFailures(
            itsOptions, static_cast<unsigned>(noise.blockSize), noise.ebn0, amplitude, simulatedBlocks);
        return noise;
    }

    const std::vector<Case>& itsCases;
    const DecoderOptions& itsOptions;
    Trial itsTrial;
    std::vector<Suspicion> itsSuspicions;
    double itsWeight = 1;
};

}  // namespace

Diagnosis diagnose(const std::vector<Case>& cases, const DecoderOptions& options)
{
    return Examination(cases, options).run();
}

}  // namespace morvik::diagnosis
