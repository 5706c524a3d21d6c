// MapSuggestion: a map for the names that designers usually give.
#include <algorithm>
#include <array>
#include <cctype>
#include <map>
#include <optional>

#include "DumpNames.h"
#include "NameMap.h"
#include "base/Json.h"

namespace morvik::comparison {

namespace {

using Json = nlohmann::ordered_json;
using Words = std::vector<std::string>;

/// A name in its parts: "fwd_metric[3]" has the words fwd and metric and the number 3.
struct Parts {
    Words words;
    std::string beforeNumber;
    std::optional<unsigned> number;
    std::string afterNumber;
};

/// Words that say how a value is stored or driven, not what it is.
bool isOrnament(const std::string& word)
{
    static const Words ornaments = {"q", "r", "reg", "i", "o", "in", "out", "d", "s", "sig", "w", "net", "dbg"};
    return std::find(ornaments.begin(), ornaments.end(), word) != ornaments.end();
}

Words wordsOf(const std::string& text)
{
    Words words(1);
    char before = '_';
    for (const char character : text) {
        const auto byte = static_cast<unsigned char>(character);
        const bool isUpper = std::isupper(byte) != 0;
        const bool beginsWord = isUpper && std::islower(static_cast<unsigned char>(before)) != 0;
        if (beginsWord || std::isalpha(byte) == 0) {
            words.emplace_back();
        }
        words.back() += std::isalpha(byte) != 0 ? std::string(1, static_cast<char>(std::tolower(byte))) : "";
        before = character;
    }
    words.erase(std::remove_if(words.begin(), words.end(), [](const auto& each) { return each.empty(); }), words.end());
    while (words.size() > 1 && isOrnament(words.back())) {
        words.pop_back();
    }
    return words;
}

/// The last number of the name is that of a state or a branch.
Parts partsOf(const std::string& name)
{
    constexpr std::string_view digits = "0123456789";
    Parts parts;
    parts.words = wordsOf(name);
    const std::size_t last = name.find_last_of(digits);
    if (last == std::string::npos) {
        return parts;
    }
    const std::size_t before = name.find_last_not_of(digits, last);
    const std::size_t first = before == std::string::npos ? 0 : before + 1;
    constexpr std::size_t mostDigits = 3;
    if (last - first < mostDigits) {
        parts.number = static_cast<unsigned>(std::stoul(name.substr(first, last - first + 1)));
        parts.beforeNumber = name.substr(0, first);
        parts.afterNumber = name.substr(last + 1);
    }
    return parts;
}

bool hasAny(const Words& words, const Words& wanted)
{
    return std::any_of(words.begin(), words.end(), [&wanted](const std::string& word) {
        return std::find(wanted.begin(), wanted.end(), word) != wanted.end();
    });
}

/// What designers call the values of a stage. bm is a branch or a backward metric: the number of them tells, or the
/// bits of all, as a branch metric is narrower than a state metric.
std::optional<Stage> stageNamed(const Words& words, unsigned highestNumber, unsigned bits)
{
    static const std::array<std::pair<Stage, Words>, 6> names = {
        {{Stage::extrinsic, {"extrinsic", "ext", "extr", "le", "lext"}},
         {Stage::intrinsic, {"intrinsic", "int", "intr"}},
         {Stage::forward, {"alpha", "am", "fm", "fwd", "forward", "fsm"}},
         {Stage::backward, {"beta", "bwd", "backward", "bsm"}},
         {Stage::branch, {"gamma", "branch", "g", "bmu", "gm"}},
         {Stage::ratio, {"llr", "ratio", "lapp", "app", "aposteriori"}}}};
    for (const auto& [stage, own] : names) {
        if (hasAny(words, own)) {
            return stage;
        }
    }
    if (hasAny(words, {"bm"})) {
        constexpr unsigned branches = signalsOf(Stage::branch).count;
        return highestNumber >= branches || bits > branches * passBits ? Stage::backward : Stage::branch;
    }
    return std::nullopt;
}

class Suggester {
public:
    explicit Suggester(const DumpNames& names) : itsNames(names)
    {
        for (const DumpName& each : names.names) {
            const Parts parts = partsOf(each.name);
            if (parts.number) {
                unsigned& highest = itsHighest[formOf(parts)];
                highest = std::max(highest, *parts.number);
            }
        }
    }

    SuggestedMap suggest()
    {
        if (!itsNames.hasRows) {
            placeControls();
        }
        for (const DumpName& each : itsNames.names) {
            if (itsPlaced.count(each.name) == 0) {
                placeSignal(each);
            }
        }
        Json map = Json::object();
        if (!itsColumns.empty()) {
            map["columns"] = itsColumns;
        }
        if (!itsSignals.empty()) {
            map["signals"] = itsSignals;
        }
        if (itsNames.isHexadecimal) {
            map["numbers"] = "hex";
        }
        constexpr int indentation = 2;
        return {map.dump(indentation, ' ', false, Json::error_handler_t::replace) + '\n', itsNotes};
    }

private:
    static std::string formOf(const Parts& parts)
    {
        return parts.beforeNumber + "{}" + parts.afterNumber;
    }

    /// The first of the usual names that the dump has tells half-iteration or step.
    void placeControls()
    {
        placeControl(
            "half_iteration",
            {"half_iteration", "halfiteration", "half_iter", "half_it", "hiter", "siso_run", "pass", "half", "h"});
        placeControl("step", {"step", "trellis_step", "trellis", "position", "pos", "idx", "index", "k", "n"});
    }

    void placeControl(const std::string& key, const Words& usual)
    {
        for (const std::string& wanted : usual) {
            if (const DumpName* const found = called(wanted)) {
                itsPlaced.insert(found->name);
                if (found->name != key) {
                    itsColumns[key] = found->name;
                }
                return;
            }
        }
        itsNotes.push_back("no name looks like that of the " + (key == "step" ? key : "half-iteration"));
    }

    /// The name itself, or another one of the same words: k is a step rather than K, which may be the block size.
    const DumpName* called(const std::string& wanted) const
    {
        const DumpName* alike = nullptr;
        for (const DumpName& each : itsNames.names) {
            if (each.name == wanted) {
                return &each;
            }
            alike = alike == nullptr && wordsOf(each.name) == wordsOf(wanted) ? &each : alike;
        }
        return alike;
    }

    void placeSignal(const DumpName& name)
    {
        if (signalCalled(name.name)) {
            return;  // known without a map
        }
        const Parts parts = partsOf(name.name);
        const unsigned highest = parts.number ? itsHighest.at(formOf(parts)) : 0;
        const auto stage = stageNamed(parts.words, highest, name.bits);
        if (!stage || !placeInStage(name, parts, *stage)) {
            leaveOut(name.name);
        }
    }

    bool placeInStage(const DumpName& name, const Parts& parts, Stage stage)
    {
        const unsigned count = signalsOf(stage).count;
        if (count <= 1) {
            const bool fits = name.bits == 0 || isWidth(name.bits);
            return fits && place(name.name, stage, passSignals[signalsOf(stage).first].name);
        }
        if (name.bits > 0 && name.bits % count == 0 && isWidth(name.bits / count)) {
            Json packed = {{"packed", nameOf(stage)}};
            if (name.bits / count != passBits) {
                packed["bits"] = name.bits / count;
            }
            return place(name.name, stage, packed);
        }
        if (!parts.number || itsHighest.at(formOf(parts)) >= count || (name.bits > 0 && !isWidth(name.bits))) {
            return false;
        }
        const char* const word = stage == Stage::branch ? "{branch}" : "{state}";
        return place(parts.beforeNumber + word + parts.afterNumber, stage, nameOf(stage) + word);
    }

    /// The first name that looks like a signal of the stage is taken; its numbers are one pattern.
    bool place(const std::string& name, Stage stage, const Json& meaning)
    {
        const auto [taken, isNew] = itsTaken.try_emplace(stage, name);
        if (isNew) {
            itsSignals[name] = meaning;
        }
        return taken->second == name;
    }

    static bool isWidth(unsigned bits)
    {
        constexpr unsigned fewest = 8;
        constexpr unsigned most = 32;
        return bits >= fewest && bits <= most;
    }

    /// Rows of CSV may have no names that a map does not know.
    void leaveOut(const std::string& name)
    {
        const std::string note = "not placed: " + name;
        if (itsNotes.empty() || itsNotes.back() != note) {  // names alike but for their widths follow each other
            itsNotes.push_back(note);
        }
        if (itsNames.hasRows) {
            itsSignals[name] = nullptr;
        }
    }

    const DumpNames& itsNames;
    std::map<std::string, unsigned> itsHighest;  // number of names that are alike but for their numbers
    std::set<std::string> itsPlaced;
    std::map<Stage, std::string> itsTaken;  // the name or pattern of a stage
    Json itsColumns = Json::object();
    Json itsSignals = Json::object();
    std::vector<std::string> itsNotes;
};

}  // namespace

SuggestedMap suggestMap(const DumpNames& names)
{
    return Suggester(names).suggest();
}

}  // namespace morvik::comparison
