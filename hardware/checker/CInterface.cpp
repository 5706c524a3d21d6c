// CInterface: the functions of morvik_checker.h. No exception passes out of them.
#include <algorithm>
#include <array>
#include <deque>
#include <exception>
#include <memory>
#include <optional>
#include <sstream>
#include <string>
#include <utility>

#include "Checker.h"
#include "base/Error.h"
#include "base/OutputFile.h"
#include "hardware/testbench/Decoder.h"
#include "hardware/testbench/SizeHint.h"
#include "morvik_checker.h"
#include "rules/BlockSizes.h"

using morvik::Stage;
using morvik::checker::Checker;
using morvik::checker::Place;
using morvik::checker::Standing;
using morvik::checker::Values;
using morvik::rules::tailPositions;

static_assert(MORVIK_CHECKER_INTRINSIC == morvik::signalsOf(Stage::intrinsic).first);
static_assert(MORVIK_CHECKER_G == morvik::signalsOf(Stage::branch).first);
static_assert(MORVIK_CHECKER_ALPHA == morvik::signalsOf(Stage::forward).first);
static_assert(MORVIK_CHECKER_BETA == morvik::signalsOf(Stage::backward).first);
static_assert(MORVIK_CHECKER_LLR == morvik::signalsOf(Stage::ratio).first);
static_assert(MORVIK_CHECKER_EXTRINSIC == morvik::signalsOf(Stage::extrinsic).first);
static_assert(
    MORVIK_CHECKER_SIGNALS == morvik::signalCount,
    "the numbers of signals have changed: morvik_checker.h, morvik_pkg.sv and morvik_checker_pkg.vhd need them");

struct morvik_checker {
    std::optional<Checker> checker;
    morvik::SoftBlock block;
    std::size_t positions = 0;  ///< put, also beyond what a block holds
    std::deque<std::string> messages;
    bool isExhausted = false;  ///< a call found no memory, which no message has told yet
    std::string text;          ///< last given to the caller
};

namespace {

/// A call with arguments that are not allowed, or in the wrong order.
struct Wrong {
    std::string what;
};

using Rows = std::array<morvik::SignalRange, morvik::signalCount>;

/// The row of each signal.
constexpr Rows rowsOfSignals()
{
    Rows rows{};
    for (unsigned signal = 0; signal < morvik::signalCount; ++signal) {
        rows[signal] = morvik::signalsOf(morvik::stageOf(signal));
    }
    return rows;
}

constexpr Rows rowOf = rowsOfSignals();

/// What waits to be taken. A caller who never asks keeps the first ones.
constexpr std::size_t mostMessages = 1000;

void queue(morvik_checker& checker, const std::string& message)
{
    if (checker.messages.size() < mostMessages) {
        checker.messages.push_back(message);
    }
}

std::string withoutLastLineFeeds(std::string text)
{
    text.erase(text.find_last_not_of('\n') + 1);
    return text;
}

/// Calls a function with the checker; what it throws becomes a message and an answer.
template <class Function>
std::int32_t guarded(morvik_checker* checker, Function function)
{
    if (checker == nullptr) {
        return MORVIK_CHECKER_REFUSED;
    }
    try {
        try {
            return function(*checker);
        } catch (const Wrong& wrong) {
            queue(*checker, "ERROR:checker:" + wrong.what);
        } catch (const morvik::Refusal& refusal) {
            queue(*checker, refusal.what());
        } catch (const std::bad_alloc&) {
            throw;
        } catch (const std::exception& error) {
            queue(*checker, std::string("ERROR:checker:Internal error: ") + error.what());
        }
        return MORVIK_CHECKER_REFUSED;
    } catch (const std::exception&) {
        checker->isExhausted = true;
        return MORVIK_CHECKER_OUT_OF_MEMORY;
    }
}

Checker& openOf(morvik_checker& checker)
{
    if (!checker.checker) {
        throw Wrong{"The configuration of this checker was refused, so it does not check"};
    }
    return *checker.checker;
}

Checker& startedOf(morvik_checker& checker)
{
    Checker& open = openOf(checker);
    if (!open.hasBlock()) {
        throw Wrong{"There is no block: start comes before values are observed or asked for"};
    }
    return open;
}

const Checker& countingOf(morvik_checker& checker)
{
    const Checker& open = openOf(checker);
    if (!open.countsSituations()) {
        throw Wrong{"Situations are counted only if count_situations asks for it"};
    }
    return open;
}

[[noreturn]] void failOutside(const std::string& what, std::int32_t given, unsigned count)
{
    throw Wrong{what + ' ' + std::to_string(given) + " is not allowed, expected 0 to " + std::to_string(count - 1)};
}

unsigned below(const char* what, std::int32_t given, unsigned count)
{
    if (given < 0 || static_cast<unsigned>(given) >= count) {
        failOutside(what, given, count);
    }
    return static_cast<unsigned>(given);
}

Place placeOf(const Checker& checker, std::int32_t signal, std::int32_t pass, std::int32_t step)
{
    return {below("Half-iteration", pass, checker.passes()),
            below("Signal", signal, morvik::signalCount),
            below("Step", step, checker.steps())};
}

[[noreturn]] void failBeyondRegister(unsigned signal, std::int32_t given)
{
    throw Wrong{std::string(morvik::passSignals[signal].name) + " " + std::to_string(given) +
                " is not allowed, expected -2048 to 2047: eighths, a register's bits in two's complement, "
                "sign-extended"};
}

std::int16_t valueOf(unsigned signal, std::int32_t given)
{
    if (given >= Values::smallest && given <= Values::largest) {
        return static_cast<std::int16_t>(given);
    }
    if (given == MORVIK_CHECKER_UNKNOWN) {
        return Values::unknown;
    }
    failBeyondRegister(signal, given);
}

/// Observes the values of consecutive signals, and tells of the block's first difference.
std::int32_t observe(morvik_checker& checker, const Place& place, unsigned count, const std::int32_t* given)
{
    Checker& started = *checker.checker;
    std::array<std::int16_t, 8> values{};
    for (unsigned i = 0; i < count; ++i) {
        values[i] = valueOf(place.signal + i, given[i]);
    }
    const bool agreed = started.differences() == 0;
    const bool agrees = started.observe(place, values.data(), count);
    if (agreed && !agrees) {
        queue(checker, "ERROR:checker:" + started.headline() + '\n' + withoutLastLineFeeds(started.firstDifference()));
    }
    return agrees ? MORVIK_CHECKER_AGREES : MORVIK_CHECKER_DIFFERS;
}

void forgetPositions(morvik_checker& checker)
{
    checker.positions = 0;
    for (auto* stream : {&checker.block.rsc1Sys, &checker.block.rsc1Par, &checker.block.rsc2Par}) {
        stream->clear();
    }
}

/// The positions that were put, which are forgotten.
morvik::SoftBlock taken(morvik_checker& checker)
{
    const std::size_t positions = checker.positions;
    morvik::SoftBlock block = checker.block;
    forgetPositions(checker);
    if (positions == 0) {
        throw Wrong{"The block is empty, but a block of K bits has K + 4 soft values in each stream"};
    }
    const auto bits = static_cast<std::uint32_t>(positions - std::min<std::size_t>(positions, tailPositions));
    if (morvik::rules::findBlockSize(bits) == nullptr) {
        throw Wrong{"Block size not supported" + morvik::sizeHint(positions)};
    }
    return block;
}

void startOn(morvik_checker& checker, const morvik::SoftBlock& block, unsigned iterations)
{
    std::ostringstream warnings;
    checker.checker->start(block, iterations, warnings);
    std::istringstream lines(warnings.str());
    for (std::string line; std::getline(lines, line);) {
        queue(checker, line);
    }
}

}  // namespace

morvik_checker* morvik_checker_create(int32_t num_pu, int32_t algorithm)
{
    try {
        auto made = std::make_unique<morvik_checker>();
        for (auto* stream : {&made->block.rsc1Sys, &made->block.rsc1Par, &made->block.rsc2Par}) {
            stream->reserve(morvik::maxPositions);
        }
        auto generics = veltra_ip_morvik_v1_0_get_default_generics();
        generics.C_NUM_PU = num_pu;
        generics.C_ALGORITHM_TYPE = algorithm;
        guarded(made.get(), [&](morvik_checker& checker) {
            checker.checker.emplace(generics);
            return MORVIK_CHECKER_AGREES;
        });
        return made.release();
    } catch (const std::exception&) {
        return nullptr;
    }
}

void morvik_checker_destroy(morvik_checker* checker)
{
    delete checker;
}

int32_t morvik_checker_is_open(const morvik_checker* checker)
{
    return checker != nullptr && checker->checker ? 1 : 0;
}

void morvik_checker_put(morvik_checker* checker, int32_t sys, int32_t par1, int32_t par2)
{
    if (checker == nullptr) {
        return;
    }
    if (checker->positions < morvik::maxPositions) {  // there is room, reserved at creation
        checker->block.rsc1Sys.push_back(sys);
        checker->block.rsc1Par.push_back(par1);
        checker->block.rsc2Par.push_back(par2);
    }
    ++checker->positions;
}

int32_t morvik_checker_start(morvik_checker* checker, int32_t iterations)
{
    return guarded(checker, [=](morvik_checker& each) {
        openOf(each).forget();
        const morvik::SoftBlock block = taken(each);
        constexpr std::int32_t mostIterations = 15;
        if (iterations < 1 || iterations > mostIterations) {
            throw Wrong{std::to_string(iterations) + " iterations are not allowed, expected 1 to 15"};
        }
        startOn(each, block, static_cast<unsigned>(iterations));
        return MORVIK_CHECKER_AGREES;
    });
}

void morvik_checker_forget(morvik_checker* checker)
{
    guarded(checker, [](morvik_checker& each) {
        forgetPositions(each);
        if (each.checker) {
            each.checker->forget();
        }
        return MORVIK_CHECKER_AGREES;
    });
}

int32_t morvik_checker_signal(const char* name)
{
    for (unsigned signal = 0; name != nullptr && signal < morvik::signalCount; ++signal) {
        const std::string known = morvik::passSignals[signal].name;
        if (name == known || name + std::string("0") == known) {
            return static_cast<std::int32_t>(signal);
        }
    }
    return -1;
}

int32_t morvik_checker_observe(
    morvik_checker* checker, int32_t signal, int32_t half_iteration, int32_t step, int32_t value)
{
    return guarded(checker, [=](morvik_checker& each) {
        return observe(each, placeOf(startedOf(each), signal, half_iteration, step), 1, &value);
    });
}

int32_t morvik_checker_observe_row(
    morvik_checker* checker, int32_t signal, int32_t half_iteration, int32_t step, const int32_t* values)
{
    return guarded(checker, [=](morvik_checker& each) {
        const Place place = placeOf(startedOf(each), signal, half_iteration, step);
        const auto [first, count] = rowOf[place.signal];
        if (place.signal != first) {
            throw Wrong{std::string(morvik::passSignals[place.signal].name) + " is not the first of its row, " +
                        morvik::passSignals[first].name};
        }
        if (values == nullptr) {
            throw Wrong{"The row is a null pointer"};
        }
        return observe(each, place, count, values);
    });
}

int32_t morvik_checker_value(morvik_checker* checker, int32_t signal, int32_t half_iteration, int32_t step)
{
    std::int32_t value = MORVIK_CHECKER_UNKNOWN;
    guarded(checker, [&](morvik_checker& each) {
        const Checker& started = startedOf(each);
        const auto expected = started.expected(placeOf(started, signal, half_iteration, step));
        value = expected ? *expected : MORVIK_CHECKER_UNKNOWN;
        return MORVIK_CHECKER_AGREES;
    });
    return value;
}

int32_t morvik_checker_ratio(morvik_checker* checker, int32_t bit)
{
    std::int32_t value = MORVIK_CHECKER_UNKNOWN;
    guarded(checker, [&](morvik_checker& each) {
        const Checker& started = startedOf(each);
        const unsigned step = below("Bit", bit, started.steps() - morvik::rules::tailSteps);
        value = *started.expected({started.passes() - 1, MORVIK_CHECKER_LLR, step});
        return MORVIK_CHECKER_AGREES;
    });
    return value;
}

namespace {

/// 0 for a signal that does not exist.
morvik::checker::Seen seenOf(const morvik_checker* checker, std::int32_t signal)
{
    return checker != nullptr && checker->checker && signal >= 0 && signal < MORVIK_CHECKER_SIGNALS
               ? checker->checker->seen(static_cast<unsigned>(signal))
               : morvik::checker::Seen{};
}

}  // namespace

int32_t morvik_checker_seen(const morvik_checker* checker, int32_t signal)
{
    return static_cast<std::int32_t>(seenOf(checker, signal).seen);
}

int32_t morvik_checker_expected(const morvik_checker* checker, int32_t signal)
{
    return static_cast<std::int32_t>(seenOf(checker, signal).expected);
}

int32_t morvik_checker_differences(const morvik_checker* checker)
{
    return checker != nullptr && checker->checker ? static_cast<std::int32_t>(checker->checker->differences()) : 0;
}

int32_t morvik_checker_standing(const morvik_checker* checker)
{
    if (checker == nullptr || !checker->checker || !checker->checker->hasBlock()) {
        return MORVIK_CHECKER_REFUSED;
    }
    switch (checker->checker->standing()) {
    case Standing::agrees:
        return MORVIK_CHECKER_AGREES;
    case Standing::differs:
        return MORVIK_CHECKER_DIFFERS;
    case Standing::incomplete:
        break;
    }
    return MORVIK_CHECKER_INCOMPLETE;
}

const char* morvik_checker_report(morvik_checker* checker)
{
    if (checker == nullptr) {
        return "";
    }
    checker->text.clear();
    guarded(checker, [](morvik_checker& each) {
        each.text = withoutLastLineFeeds(startedOf(each).report());
        return MORVIK_CHECKER_AGREES;
    });
    return checker->text.c_str();
}

int32_t morvik_checker_count_situations(morvik_checker* checker)
{
    return guarded(checker, [](morvik_checker& each) {
        openOf(each).countSituations();
        return MORVIK_CHECKER_AGREES;
    });
}

const char* morvik_checker_situations(morvik_checker* checker)
{
    if (checker == nullptr) {
        return "";
    }
    checker->text.clear();
    guarded(checker, [](morvik_checker& each) {
        each.text = morvik::coverage::textOf(countingOf(each).situations());
        return MORVIK_CHECKER_AGREES;
    });
    return checker->text.c_str();
}

int32_t morvik_checker_write_situations(morvik_checker* checker, const char* file)
{
    return guarded(checker, [&](morvik_checker& each) {
        const Checker& counting = countingOf(each);
        if (file == nullptr) {
            throw Wrong{"The file name is a null pointer"};
        }
        try {
            morvik::base::writeFile(file, morvik::coverage::textOf(counting.situations()));
        } catch (const morvik::base::Error& error) {
            throw Wrong{error.what()};
        }
        return MORVIK_CHECKER_AGREES;
    });
}

const char* morvik_checker_message(morvik_checker* checker)
{
    if (checker == nullptr) {
        return "";
    }
    checker->text.clear();
    if (checker->messages.empty() && checker->isExhausted) {
        checker->isExhausted = false;
        return "ERROR:checker:Out of memory";
    }
    if (!checker->messages.empty()) {
        checker->text.swap(checker->messages.front());
        checker->messages.pop_front();
    }
    return checker->text.c_str();
}
