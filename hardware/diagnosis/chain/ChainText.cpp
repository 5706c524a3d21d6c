// ChainText: a diagnosis of transport blocks as text and as JSON.
#include "ChainText.h"

#include <algorithm>
#include <cmath>
#include <nlohmann/json.hpp>

#include "base/Text.h"
#include "hardware/diagnosis/DiagnosisText.h"

namespace morvik::diagnosis {

namespace {

std::string listed(const ChainMistakes& mistakes, const ChainFormat& format)
{
    std::string text;
    for (const Explanation& each : explain(mistakes, format)) {
        text += (text.empty() ? "" : ", and ") + each.what;
    }
    return text.empty() ? "none: as it is" : text;
}

std::string row(const ChainAttempt& attempt, const ChainDiagnosis& diagnosis)
{
    const std::string decoded = std::to_string(attempt.decoded) + " of " + std::to_string(diagnosis.blocks);
    return base::rightAligned(decoded, 9) + base::rightAligned(std::to_string(attempt.wrongBits), 12) +
           base::rightAligned(percent(attempt.signs), 13) + "  " + listed(attempt.mistakes, diagnosis.format) + '\n';
}

/// The attempt without changes, the best or nearest one, and the likeliest others with no more mistakes.
std::string table(const ChainDiagnosis& diagnosis)
{
    const ChainAttempt& likeliest = diagnosis.nearest ? diagnosis.nearest->attempt : diagnosis.best;
    constexpr std::size_t most = 4;
    std::string text =
        "  decoded  wrong bits  wrong signs  mistakes undone\n" + row(diagnosis.attempts.front(), diagnosis);
    const std::string best = row(likeliest, diagnosis);
    const unsigned count = likeliest.mistakes.count(diagnosis.format);
    text += count > 0 ? best : "";
    std::size_t shown = 0;
    for (std::size_t i = 1; i < diagnosis.attempts.size() && diagnosis.verdict != Verdict::healthy; ++i) {
        const std::string line = row(diagnosis.attempts[i], diagnosis);
        const unsigned mistakes = diagnosis.attempts[i].mistakes.count(diagnosis.format);
        if (line != best && mistakes <= std::max(count, 1U) && shown < most) {
            text += line;
            ++shown;
        }
    }
    return text;
}

std::string foundText(const ChainDiagnosis& diagnosis)
{
    std::string text;
    for (const Explanation& each : explain(diagnosis.best.mistakes, diagnosis.format)) {
        text += "Found: " + each.what + ".\n  " + each.change + '\n';
    }
    for (const ChainMistakes& equal : diagnosis.equals) {
        text += "Or: " + listed(equal, diagnosis.format) + "; these values cannot tell which.\n";
    }
    return text;
}

/// What noise alone does not do to signs.
std::string doubtText(const ChainDiagnosis& diagnosis)
{
    if (diagnosis.uneven) {
        return percent(diagnosis.uneven->inside) + " of the signs are wrong in " + diagnosis.uneven->name + ", " +
               percent(diagnosis.uneven->others) + " elsewhere";
    }
    if (diagnosis.isContradictory) {
        return "strong values are wrong too often for noise";
    }
    return "signs are as wrong as in noise at Es/N0 = " + fixed(diagnosis.nearest->esn0, 1) + " dB, " +
           fixed(diagnosis.nearest->limit - diagnosis.nearest->esn0, 1) + " dB below Shannon's limit";
}

std::string unexplainedText(const ChainDiagnosis& diagnosis)
{
    if (diagnosis.nearest) {
        return ", and no known mistake explains it.\nNearest: " +
               listed(diagnosis.nearest->attempt.mistakes, diagnosis.format) + ". But then " + doubtText(diagnosis) +
               ".\n";
    }
    return ", and " + doubtText(diagnosis) + ". Is there another order of bits or symbols, or a burst?\n";
}

std::string verdictText(const ChainDiagnosis& diagnosis)
{
    const bool isMistaken = diagnosis.best.mistakes.count(diagnosis.format) > 0;
    const std::size_t failing = diagnosis.blocks - diagnosis.best.decoded;
    const std::string failures = std::to_string(failing) + " of " + std::to_string(diagnosis.blocks) +
                                 (diagnosis.blocks == 1 ? " transport block fails" : " transport blocks fail");
    const auto noiseText = [&] {
        return "The noise is that of Es/N0 = " + fixed(diagnosis.noise->esn0, 1) + " dB, where " +
               std::to_string(diagnosis.noise->failed) + " of " + std::to_string(diagnosis.noise->simulated) +
               " simulated transport blocks fail.\n";
    };
    switch (diagnosis.verdict) {
    case Verdict::healthy:
        return "Healthy: all transport blocks decode unchanged.\n";
    case Verdict::mistaken:
        return "All transport blocks decode once this is fixed.\n";
    case Verdict::careless:
        return "All transport blocks decode, but not as well as they could.\n";
    case Verdict::noisy:
        return "Too noisy: " + failures + (isMistaken ? " even then" : ", and no mistake explains it") + ".\n" +
               noiseText();
    case Verdict::unexplained:
        if (!diagnosis.noise) {
            return "Not explained: " + failures + (isMistaken ? " even then" : "") + unexplainedText(diagnosis);
        }
        return "Not explained: " + failures + (isMistaken ? " even then" : " for another reason") +
               ", which noise of this strength hardly ever causes.\n" + noiseText();
    case Verdict::strange:
    case Verdict::unrelated:
        break;
    }
    return diagnosis.known == 0
               ? "No CRC fits, whatever mistake is undone. With --reference, signs tell more than CRCs.\n"
               : "Unrelated: whatever mistake is undone, the signs are wrong as often as by chance. Do the bits "
                 "belong to these transport blocks?\n";
}

std::string scaleText(const ChainDiagnosis& diagnosis)
{
    if (diagnosis.verdict == Verdict::unexplained && !diagnosis.noise) {
        return "";
    }
    if (diagnosis.steps <= 0) {
        return "Scale: too few signs are wrong to tell what the values mean.\n";
    }
    const bool isFarOff = std::abs(std::log2(diagnosis.steps / diagnosis.suitableSteps)) > 1;
    return "Scale: " + fixed(diagnosis.steps, 1) + " steps of the core for a log-likelihood ratio of 1; " +
           fixed(diagnosis.suitableSteps, 1) + " suit (docs/scale.md)." +
           (isFarOff ? " This is far from it and costs error rate.\n" : "\n");
}

nlohmann::ordered_json mistakesOf(const ChainMistakes& mistakes, const ChainFormat& format)
{
    nlohmann::ordered_json list = nlohmann::ordered_json::array();
    for (const Explanation& each : explain(mistakes, format)) {
        list.push_back({{"name", each.name}, {"what", each.what}, {"change", each.change}});
    }
    return list;
}

}  // namespace

std::string textOf(const ChainDiagnosis& diagnosis)
{
    std::string text = diagnosis.known == 0 ? "" : table(diagnosis) + '\n';
    if (diagnosis.verdict != Verdict::unrelated) {
        text += foundText(diagnosis);
    }
    text += verdictText(diagnosis);
    if (diagnosis.verdict != Verdict::unrelated) {
        text += scaleText(diagnosis);
    }
    if (diagnosis.hasMore) {
        text += "Looked at the first " +
                (diagnosis.blocks == 1 ? "transport block" : std::to_string(diagnosis.blocks) + " transport blocks") +
                " only: the file has more; use --blocks N.\n";
    }
    return text;
}

std::string jsonOf(const ChainDiagnosis& diagnosis)
{
    const bool isRelated = diagnosis.verdict != Verdict::unrelated;
    nlohmann::ordered_json object = {
        {"verdict", nameOf(diagnosis.verdict)},
        {"blocks", diagnosis.blocks},
        {"more_blocks", diagnosis.hasMore},
        {"known_blocks", diagnosis.known},
        {"decoded", diagnosis.best.decoded},
        {"mistakes", mistakesOf(isRelated ? diagnosis.best.mistakes : ChainMistakes{}, diagnosis.format)},
        {"or", nlohmann::ordered_json::array()},
        {"wrong_signs", diagnosis.best.signs.fraction()},
        {"steps_per_ratio", diagnosis.steps},
        {"suitable_steps", diagnosis.suitableSteps}};
    for (const ChainMistakes& equal : diagnosis.equals) {
        object["or"].push_back(mistakesOf(equal, diagnosis.format));
    }
    if (diagnosis.nearest) {
        object["nearest"] = mistakesOf(diagnosis.nearest->attempt.mistakes, diagnosis.format);
    }
    if (diagnosis.uneven) {
        object["uneven"] = {{"part", diagnosis.uneven->name},
                            {"wrong_signs", diagnosis.uneven->inside.fraction()},
                            {"other_wrong_signs", diagnosis.uneven->others.fraction()}};
    }
    if (diagnosis.noise) {
        object["noise"] = {{"esn0_db", diagnosis.noise->esn0},
                           {"simulated_blocks", diagnosis.noise->simulated},
                           {"failed_blocks", diagnosis.noise->failed}};
    }
    object["attempts"] = nlohmann::ordered_json::array();
    for (const ChainAttempt& each : diagnosis.attempts) {
        nlohmann::ordered_json names = nlohmann::ordered_json::array();
        for (const Explanation& mistake : explain(each.mistakes, diagnosis.format)) {
            names.push_back(mistake.what);
        }
        object["attempts"].push_back({{"undone", names},
                                      {"decoded", each.decoded},
                                      {"wrong_bits", each.wrongBits},
                                      {"wrong_signs", each.signs.fraction()}});
    }
    return object.dump(2) + '\n';
}

}  // namespace morvik::diagnosis
