// DiagnosisText: a diagnosis as text and as JSON.
#include "DiagnosisText.h"

#include <algorithm>
#include <cmath>
#include <cstdio>
#include <nlohmann/json.hpp>

#include "base/Text.h"

namespace morvik::diagnosis {

namespace {

constexpr std::size_t shownAttempts = 5;

/// The mistakes, joined by "and".
std::string listed(const Mistakes& mistakes)
{
    std::string text;
    for (const Explanation& each : explain(mistakes)) {
        text += (text.empty() ? "" : ", and ") + each.what;
    }
    return text;
}

std::string row(const Attempt& attempt, std::size_t blocks)
{
    const std::string decoded = std::to_string(attempt.decoded) + " of " + std::to_string(blocks);
    const std::string undone = attempt.mistakes.count() == 0 ? "none: as it is" : listed(attempt.mistakes);
    if (!attempt.decodable) {
        return base::rightAligned(decoded, 9) + base::rightAligned("-", 12) + base::rightAligned("-", 13) + "  " +
               undone + '\n';
    }
    return base::rightAligned(decoded, 9) + base::rightAligned(std::to_string(attempt.wrongBits), 12) +
           base::rightAligned(percent(attempt.signs), 13) + "  " + undone + '\n';
}

bool isSame(const Mistakes& a, const Mistakes& b)
{
    return listed(a) == listed(b);
}

/// The attempt without changes, the best one, and the likeliest others with no more mistakes.
std::string table(const Diagnosis& diagnosis)
{
    std::string text =
        "  decoded  wrong bits  wrong signs  mistakes undone\n" + row(diagnosis.attempts.front(), diagnosis.blocks);
    if (diagnosis.best.mistakes.count() > 0) {
        text += row(diagnosis.best, diagnosis.blocks);
    }
    if (diagnosis.verdict == Verdict::healthy) {
        return text;
    }
    const unsigned most = std::max(diagnosis.best.mistakes.count(), 1U);
    std::size_t shown = 0;
    for (const Attempt& each : diagnosis.attempts) {
        const bool isOther = each.mistakes.count() > 0 && each.mistakes.count() <= most &&
                             !isSame(each.mistakes, diagnosis.best.mistakes);
        if (isOther && shown < shownAttempts) {
            text += row(each, diagnosis.blocks);
            ++shown;
        }
    }
    return text;
}

/// What the values look like once the mistakes are undone.
std::string appearanceText(const Diagnosis& diagnosis)
{
    const Appearance& appearance = diagnosis.appearance;
    std::string text = "Wrong signs: rsc1_sys " + percent(appearance.streams[0]) + ", rsc1_par " +
                       percent(appearance.streams[1]) + ", rsc2_par " + percent(appearance.streams[2]) + ", tail " +
                       percent(appearance.tail) + ".\nAmplitude: " + fixed(appearance.amplitude, 1) +
                       " in the file; 8 suits algorithm types 0 and 1 (docs/scale.md).";
    const bool isFarOff = std::abs(std::log2(std::max(appearance.amplitude, 1e-3) / 8)) > 1.5;
    text += isFarOff ? " This is far from it and costs error rate." : "";
    if (diagnosis.clipped > 0) {
        text += ' ' + std::to_string(diagnosis.clipped) + " values are beyond -128 ... 127.";
    }
    return text + '\n';
}

std::string strangerText(const Diagnosis& diagnosis)
{
    const char* const names[] = {"rsc1_sys", "rsc1_par", "rsc2_par"};
    const std::size_t stream = *diagnosis.stranger;
    return std::string("A stream does not belong to these blocks: the signs of ") + names[stream] + " are wrong in " +
           percent(diagnosis.appearance.streams[stream]) + ", those of the others in " +
           percent(diagnosis.appearance.others(stream)) + ".\nIs it " +
           (stream == 2 ? "of another interleaver" : "of another encoder") + ", or of another block?\n";
}

std::string noiseText(const Diagnosis& diagnosis)
{
    const Noise& noise = *diagnosis.noise;
    return "The noise is that of Eb/N0 = " + fixed(noise.ebn0, 1) + " dB, where " + std::to_string(noise.failed) +
           " of " + std::to_string(noise.simulated) + " simulated blocks of " + std::to_string(noise.blockSize) +
           " bits fail.\n";
}

std::string failing(const Diagnosis& diagnosis)
{
    return std::to_string(diagnosis.blocks - diagnosis.best.decoded) + " of " + std::to_string(diagnosis.blocks) +
           (diagnosis.blocks == 1 ? " block fails" : " blocks fail");
}

std::string verdictText(const Diagnosis& diagnosis)
{
    const bool isMistaken = diagnosis.best.mistakes.count() > 0;
    switch (diagnosis.verdict) {
    case Verdict::healthy:
        return "Healthy: all blocks decode unchanged.\n";
    case Verdict::mistaken:
        return "All blocks decode once this is fixed.\n";
    case Verdict::careless:
        return "All blocks decode, but not as well as they could.\n";
    case Verdict::strange:
        return strangerText(diagnosis);
    case Verdict::noisy:
        return "Too noisy: " + failing(diagnosis) + (isMistaken ? " even then" : ", and no mistake explains it") +
               ".\n" + noiseText(diagnosis);
    case Verdict::unexplained:
        return "Not explained: " + failing(diagnosis) + (isMistaken ? " even then" : " for another reason") +
               ", which noise of this strength hardly ever causes.\n" + noiseText(diagnosis);
    case Verdict::unrelated:
        break;
    }
    return "Unrelated: whatever mistake is undone, the signs are wrong as often as by chance. Do the bits "
           "belong "
           "to these blocks?\n";
}

nlohmann::ordered_json mistakesOf(const Mistakes& mistakes)
{
    nlohmann::ordered_json list = nlohmann::ordered_json::array();
    for (const Explanation& each : explain(mistakes)) {
        list.push_back({{"name", each.name}, {"what", each.what}, {"change", each.change}});
    }
    return list;
}

nlohmann::ordered_json attemptOf(const Attempt& attempt)
{
    nlohmann::ordered_json names = nlohmann::ordered_json::array();
    for (const Explanation& each : explain(attempt.mistakes)) {
        names.push_back(each.what);
    }
    nlohmann::ordered_json object = {{"undone", names}, {"decodable", attempt.decodable}};
    if (attempt.decodable) {
        object["decoded"] = attempt.decoded;
        object["wrong_bits"] = attempt.wrongBits;
        object["wrong_signs"] = attempt.signs.fraction();
    }
    return object;
}

}  // namespace

std::string fixed(double value, int decimals)
{
    char text[64];
    std::snprintf(text, sizeof text, "%.*f", decimals, value);
    return text;
}

std::string percent(const Signs& signs)
{
    return fixed(100 * signs.fraction(), 1) + " %";
}

const char* nameOf(Verdict verdict)
{
    switch (verdict) {
    case Verdict::healthy:
        return "healthy";
    case Verdict::mistaken:
        return "mistaken";
    case Verdict::careless:
        return "careless";
    case Verdict::strange:
        return "strange";
    case Verdict::noisy:
        return "noisy";
    case Verdict::unexplained:
        return "unexplained";
    case Verdict::unrelated:
        break;
    }
    return "unrelated";
}

std::string textOf(const Diagnosis& diagnosis)
{
    std::string text = table(diagnosis) + '\n';
    if (diagnosis.verdict != Verdict::unrelated) {
        for (const Explanation& each : explain(diagnosis.best.mistakes)) {
            text += "Found: " + each.what + ".\n  " + each.change + '\n';
        }
    }
    text += verdictText(diagnosis);
    if (diagnosis.verdict != Verdict::unrelated) {
        text += appearanceText(diagnosis);
    }
    if (!diagnosis.hasNegative) {
        text += "No value is negative, though half should be: these are hard bits, or were read as unsigned.\n";
    }
    if (diagnosis.hasMore) {
        text += "Looked at the first " +
                (diagnosis.blocks == 1 ? "block" : std::to_string(diagnosis.blocks) + " blocks") +
                " only: the file has more; use --blocks N.\n";
    }
    return text;
}

std::string jsonOf(const Diagnosis& diagnosis)
{
    const Appearance& appearance = diagnosis.appearance;
    nlohmann::ordered_json object = {
        {"verdict", nameOf(diagnosis.verdict)},
        {"blocks", diagnosis.blocks},
        {"more_blocks", diagnosis.hasMore},
        {"decoded", diagnosis.best.decoded},
        {"mistakes", mistakesOf(diagnosis.verdict == Verdict::unrelated ? Mistakes{} : diagnosis.best.mistakes)},
        {"wrong_signs",
         {{"rsc1_sys", appearance.streams[0].fraction()},
          {"rsc1_par", appearance.streams[1].fraction()},
          {"rsc2_par", appearance.streams[2].fraction()},
          {"tail", appearance.tail.fraction()}}},
        {"amplitude", appearance.amplitude},
        {"clipped_values", diagnosis.clipped}};
    if (diagnosis.noise) {
        object["noise"] = {{"ebn0_db", diagnosis.noise->ebn0},
                           {"block_size", diagnosis.noise->blockSize},
                           {"simulated_blocks", diagnosis.noise->simulated},
                           {"failed_blocks", diagnosis.noise->failed}};
    }
    object["attempts"] = nlohmann::ordered_json::array();
    for (const Attempt& each : diagnosis.attempts) {
        object["attempts"].push_back(attemptOf(each));
    }
    return object.dump(2) + '\n';
}

}  // namespace morvik::diagnosis
