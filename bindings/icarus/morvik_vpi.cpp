// morvik_vpi: the model as system functions of Verilog, for simulators with VPI and without DPI. docs/icarus.md
// explains them.
//
//     handle = $morvik_create(num_pu, algorithm, tag_width);                  0 when they are refused
//     status = $morvik_decode(handle, sys, par1, par2, size, iterations, tag, dout);
//     tag = $morvik_tag(handle);                                              of the last block
//     $morvik_destroy(handle);
//
// And a checker, which docs/checker.md explains:
//
//     handle = $morvik_checker_create(num_pu, algorithm);                     0 when they are refused
//     status = $morvik_checker_start(handle, sys, par1, par2, size, iterations);
//     answer = $morvik_observe(handle, signal, half_iteration, step, value, ...);
//     value = $morvik_value(handle, signal, half_iteration, step);            x where the core computes none
//     ratio = $morvik_ratio(handle, bit);                                     of the last pass
//     standing = $morvik_report(handle, partial);
//     $morvik_count_situations(handle);
//     status = $morvik_write_situations(handle, file);
//     $morvik_checker_destroy(handle);
//
// The units of the core are in Units.cpp.
#include <algorithm>
#include <array>
#include <cstddef>
#include <cstdint>
#include <map>
#include <memory>
#include <string>
#include <vector>

#include "Units.h"
#include "Vpi.h"
#include "bindings/simulator/Session.h"
#include "hardware/testbench/Signals.h"
#include "morvik_checker.h"
#include "rules/Tail.h"

namespace {

using morvik::simulator::Session;
using namespace morvik::icarus;

constexpr int tailPositions = morvik::rules::tailPositions;

/// A system task or function: its name, and one letter per argument: i an integer, a an array of soft values, d an
/// array of decisions, s a signal by name or number, v a value of a signal or, as the last letter, one or more of them.
struct Call {
    const char* name;
    const char* arguments;
};

std::map<int, std::unique_ptr<Session>>& sessions()
{
    static std::map<int, std::unique_ptr<Session>> all;
    return all;
}

struct DestroyChecker {
    void operator()(morvik_checker* checker) const
    {
        morvik_checker_destroy(checker);
    }
};

using Checkers = std::map<int, std::unique_ptr<morvik_checker, DestroyChecker>>;

Checkers& checkers()
{
    static Checkers all;
    return all;
}

template <class Next>
void reportAll(Next next)
{
    for (std::string line = next(); !line.empty(); line = next()) {
        report(line.rfind("WARNING:", 0) == 0 ? "WARNING" : "ERROR", line);
    }
}

void reportMessages(Session& session)
{
    reportAll([&] { return session.nextMessage(); });
}

void reportMessages(morvik_checker* checker)
{
    reportAll([=] { return morvik_checker_message(checker); });
}

/// As the result of a function.
void setUnknown(vpiHandle object)
{
    s_vpi_vecval bits{-1, -1};
    s_vpi_value value{};
    value.format = vpiVectorVal;
    value.value.vector = &bits;
    vpi_put_value(object, &value, nullptr, vpiNoDelay);
}

std::string textOf(vpiHandle object)
{
    s_vpi_value value{};
    value.format = vpiStringVal;
    vpi_get_value(object, &value);
    return value.value.str;
}

/// A signal's number, from its name or as it is.
int signalOf(vpiHandle object)
{
    if (!isString(object)) {
        return argument(object, "The signal");
    }
    const std::string name = textOf(object);
    const int signal = morvik_checker_signal(name.c_str());
    if (signal < 0) {
        throw Mistake("\"" + name + "\" is no signal; there are " + morvik::signalNames());
    }
    return signal;
}

/// A register's bits in two's complement, however they are declared; a part of a vector is always unsigned.
int observedValue(vpiHandle object)
{
    s_vpi_value value{};
    value.format = vpiVectorVal;
    vpi_get_value(object, &value);
    for (int i = 0; i * 32 < vpi_get(vpiSize, object); ++i) {
        if (value.value.vector[i].bval != 0) {
            return MORVIK_CHECKER_UNKNOWN;
        }
    }
    return valueOf(object, true, "The value");
}

morvik_checker* checkerOf(vpiHandle object)
{
    const int handle = argument(object, "The handle");
    const auto place = checkers().find(handle);
    if (place == checkers().end()) {
        throw Mistake(std::to_string(handle) + " is no checker: it was not created, or was destroyed");
    }
    return place->second.get();
}

Session& sessionOf(vpiHandle object)
{
    const int handle = argument(object, "The handle");
    const auto place = sessions().find(handle);
    if (place == sessions().end()) {
        throw Mistake(std::to_string(handle) + " is no decoder: it was not created, or was destroyed");
    }
    return *place->second;
}

/// The first element of an array with at least `count` elements.
int firstIndex(vpiHandle array, int count)
{
    const int words = vpi_get(vpiSize, array);
    if (words < count) {
        throw Mistake(std::string(vpi_get_str(vpiName, array)) + " has " + std::to_string(words) +
                      " elements, but this call needs " + std::to_string(count));
    }
    s_vpi_value left{};
    left.format = vpiIntVal;
    vpi_get_value(vpi_handle(vpiLeftRange, array), &left);
    s_vpi_value right{};
    right.format = vpiIntVal;
    vpi_get_value(vpi_handle(vpiRightRange, array), &right);
    return left.value.integer < right.value.integer ? left.value.integer : right.value.integer;
}

/// A soft value. The simulator does not say whether an array is signed; soft values always are.
int element(vpiHandle array, int index)
{
    return valueOf(vpi_handle_by_index(array, index),
                   true,
                   std::string(vpi_get_str(vpiName, array)) + "[" + std::to_string(index) + "]");
}

// ---- The calls

int create(const std::vector<vpiHandle>& arguments)
{
    static int last = 0;
    auto session = std::make_unique<Session>(
        argument(arguments[0], "num_pu"), argument(arguments[1], "algorithm"), argument(arguments[2], "tag_width"));
    reportMessages(*session);
    if (!session->open()) {
        return 0;
    }
    sessions()[++last] = std::move(session);
    return last;
}

/// Calls `put` with the soft values of each position.
template <class Put>
void putStreams(const std::vector<vpiHandle>& streams, int size, Put put)
{
    if (size <= 0) {
        throw Mistake("The size is " + std::to_string(size) + ", but a block of K bits has K + 4 positions");
    }
    int first[3] = {};
    for (std::size_t s = 0; s < 3; ++s) {
        first[s] = firstIndex(streams[s], size);
    }
    std::vector<int> values;
    for (int i = 0; i < size; ++i) {
        for (std::size_t s = 0; s < 3; ++s) {
            values.push_back(element(streams[s], first[s] + i));
        }
    }
    for (std::size_t i = 0; i < values.size(); i += 3) {
        put(values[i], values[i + 1], values[i + 2]);
    }
}

int decode(const std::vector<vpiHandle>& arguments)
{
    Session& session = sessionOf(arguments[0]);
    const int size = argument(arguments[4], "The size");
    const int firstDecision = firstIndex(arguments[7], std::max(size - tailPositions, 0));
    const int iterations = argument(arguments[5], "The number of iterations");
    const auto tag = static_cast<std::uint32_t>(argument(arguments[6], "The tag"));
    // Last: positions that were put belong to the next block, whatever call decodes it.
    putStreams({arguments[1], arguments[2], arguments[3]}, size, [&](int sys, int par1, int par2) {
        session.put(sys, par1, par2);
    });
    const int status = session.decode(iterations, tag);
    reportMessages(session);
    for (std::size_t i = 0; i < session.bits().size(); ++i) {
        setValue(vpi_handle_by_index(arguments[7], firstDecision + static_cast<int>(i)), session.bits()[i]);
    }
    return status;
}

int tag(const std::vector<vpiHandle>& arguments)
{
    return static_cast<int>(sessionOf(arguments[0]).tag());
}

int destroy(const std::vector<vpiHandle>& arguments)
{
    sessionOf(arguments[0]);
    sessions().erase(argument(arguments[0], "The handle"));
    return 0;
}

int createChecker(const std::vector<vpiHandle>& arguments)
{
    static int last = 0;
    Checkers::mapped_type checker(
        morvik_checker_create(argument(arguments[0], "num_pu"), argument(arguments[1], "algorithm")));
    if (!checker) {
        throw std::bad_alloc();
    }
    reportMessages(checker.get());
    if (morvik_checker_is_open(checker.get()) == 0) {
        return 0;
    }
    checkers()[++last] = std::move(checker);
    return last;
}

int startChecker(const std::vector<vpiHandle>& arguments)
{
    morvik_checker* const checker = checkerOf(arguments[0]);
    morvik_checker_forget(checker);  // the arguments may be refused
    const int iterations = argument(arguments[5], "The number of iterations");
    putStreams({arguments[1], arguments[2], arguments[3]},
               argument(arguments[4], "The size"),
               [=](int sys, int par1, int par2) { morvik_checker_put(checker, sys, par1, par2); });
    const int status = morvik_checker_start(checker, iterations);
    reportMessages(checker);
    return status;
}

/// A place: signal, half-iteration and step, the second argument and those behind it.
struct Place {
    int signal;
    int halfIteration;
    int step;
};

Place placeOf(const std::vector<vpiHandle>& arguments)
{
    return {signalOf(arguments[1]), argument(arguments[2], "The half-iteration"), argument(arguments[3], "The step")};
}

int observe(const std::vector<vpiHandle>& arguments)
{
    morvik_checker* const checker = checkerOf(arguments[0]);
    const Place place = placeOf(arguments);
    constexpr std::size_t before = 4;  // arguments
    std::array<std::int32_t, 8> values{};
    const std::size_t count = arguments.size() - before;
    const bool isSignal = place.signal >= 0 && place.signal < MORVIK_CHECKER_SIGNALS;
    const std::size_t row =
        isSignal ? morvik::signalsOf(morvik::stageOf(static_cast<unsigned>(place.signal))).count : 1;
    if (count != 1 && count != row) {
        throw Mistake("takes 1 value" + (row > 1 ? " or the " + std::to_string(row) + " of the row" : std::string()) +
                      ", not " + std::to_string(count));
    }
    for (std::size_t i = 0; i < count; ++i) {
        values[i] = observedValue(arguments[before + i]);
    }
    const int answer =
        count == 1 ? morvik_checker_observe(checker, place.signal, place.halfIteration, place.step, values[0])
                   : morvik_checker_observe_row(checker, place.signal, place.halfIteration, place.step, values.data());
    if (answer != MORVIK_CHECKER_AGREES) {
        reportMessages(checker);
    }
    return answer;
}

int value(const std::vector<vpiHandle>& arguments)
{
    morvik_checker* const checker = checkerOf(arguments[0]);
    const Place place = placeOf(arguments);
    const int value = morvik_checker_value(checker, place.signal, place.halfIteration, place.step);
    reportMessages(checker);
    return value;
}

int ratio(const std::vector<vpiHandle>& arguments)
{
    morvik_checker* const checker = checkerOf(arguments[0]);
    const int ratio = morvik_checker_ratio(checker, argument(arguments[1], "The bit"));
    reportMessages(checker);
    return ratio;
}

int reportBlock(const std::vector<vpiHandle>& arguments)
{
    morvik_checker* const checker = checkerOf(arguments[0]);
    const bool mayBePartial = argument(arguments[1], "partial") != 0;
    const int standing = morvik_checker_standing(checker);
    const std::string described = morvik_checker_report(checker);
    reportMessages(checker);
    if (!described.empty()) {
        vpi_printf(text("%s\n"), described.c_str());
    }
    if (standing != MORVIK_CHECKER_INCOMPLETE) {
        return standing;
    }
    if (!mayBePartial) {
        report("ERROR", "ERROR:checker:Values are missing; set partial if that is intended");
    }
    return mayBePartial ? MORVIK_CHECKER_AGREES : standing;
}

int countSituations(const std::vector<vpiHandle>& arguments)
{
    morvik_checker* const checker = checkerOf(arguments[0]);
    const int status = morvik_checker_count_situations(checker);
    reportMessages(checker);
    return status;
}

int writeSituations(const std::vector<vpiHandle>& arguments)
{
    morvik_checker* const checker = checkerOf(arguments[0]);
    const int status = morvik_checker_write_situations(checker, textOf(arguments[1]).c_str());
    reportMessages(checker);
    return status;
}

int destroyChecker(const std::vector<vpiHandle>& arguments)
{
    checkerOf(arguments[0]);
    checkers().erase(argument(arguments[0], "The handle"));
    return 0;
}

// ---- What the simulator sees

constexpr Call createCall{"$morvik_create", "iii"};
constexpr Call decodeCall{"$morvik_decode", "iaaaiiid"};
constexpr Call tagCall{"$morvik_tag", "i"};
constexpr Call destroyCall{"$morvik_destroy", "i"};
constexpr Call createCheckerCall{"$morvik_checker_create", "ii"};
constexpr Call startCheckerCall{"$morvik_checker_start", "iaaaii"};
constexpr Call observeCall{"$morvik_observe", "isiiv"};
constexpr Call valueCall{"$morvik_value", "isii"};
constexpr Call ratioCall{"$morvik_ratio", "ii"};
constexpr Call reportCall{"$morvik_report", "ii"};
constexpr Call countSituationsCall{"$morvik_count_situations", "i"};
constexpr Call writeSituationsCall{"$morvik_write_situations", "is"};
constexpr Call destroyCheckerCall{"$morvik_checker_destroy", "i"};

/// Elements of an array of reals appear to have one bit, like those of hard bits.
void checkSoftValues(vpiHandle array, const std::string& name)
{
    const int width = vpi_get(vpiSize, vpi_handle_by_index(array, firstIndex(array, 1)));
    if (width < 2 || width > 32) {
        throw Mistake(name + ", " + vpi_get_str(vpiName, array) + ", must be an array of integers of 2 to 32 bits");
    }
}

void checkArgument(vpiHandle object, char kind, std::size_t number)
{
    const std::string name = "argument " + std::to_string(number);
    const bool mustBeArray = kind == 'a' || kind == 'd';
    if (isArray(object) != mustBeArray) {
        throw Mistake(name +
                      (mustBeArray ? " must be an array, one of a fixed size" : " is an array, but must be a value"));
    }
    if (!mustBeArray && !isInteger(object) && !(kind == 's' && isString(object))) {
        throw Mistake(name + (kind == 's' ? " must be the name of a signal or its number" : " must be an integer"));
    }
    if (kind == 'a') {
        checkSoftValues(object, name);
    }
    if (kind == 'd' && vpi_get(vpiType, object) == vpiNetArray) {
        throw Mistake(name + ", " + vpi_get_str(vpiName, object) + ", must be an array of variables, not of nets");
    }
}

/// At compile time of the design: checks the number and the kinds of the arguments.
PLI_INT32 check(PLI_BYTE8* data)  // NOLINT(readability-non-const-parameter): the interface's type
{
    const auto& call = *reinterpret_cast<const Call*>(data);
    const std::string kinds = call.arguments;
    try {
        const auto arguments = argumentsOf(vpi_handle(vpiSysTfCall, nullptr));
        const bool isOpenEnded = kinds.back() == 'v';
        if (isOpenEnded ? arguments.size() < kinds.size() : arguments.size() != kinds.size()) {
            throw Mistake("takes " + std::to_string(kinds.size()) + (kinds.size() == 1 ? " argument" : " arguments") +
                          (isOpenEnded ? " or more" : "") + ", not " + std::to_string(arguments.size()));
        }
        for (std::size_t i = 0; i < arguments.size(); ++i) {
            checkArgument(arguments[i], kinds[std::min(i, kinds.size() - 1)], i + 1);
        }
    } catch (const std::exception& error) {
        failCompilation(std::string(call.name) + ": " + error.what());
    }
    return 0;
}

/// Calls a function with its arguments; an error becomes a line in the log, and `failed`.
template <int (*function)(const std::vector<vpiHandle>&), int failed, bool returns>
PLI_INT32 run(PLI_BYTE8* data)  // NOLINT(readability-non-const-parameter): the interface's type
{
    vpiHandle call = vpi_handle(vpiSysTfCall, nullptr);
    int result = failed;
    try {
        result = function(argumentsOf(call));
    } catch (const std::exception& error) {
        report("ERROR", std::string(reinterpret_cast<const Call*>(data)->name) + ": " + error.what());
    }
    if (returns && failed == MORVIK_CHECKER_UNKNOWN && result == failed) {
        setUnknown(call);
    } else if (returns) {
        setValue(call, result);
    }
    return 0;
}

void announce(const Call& call, PLI_INT32 type, PLI_INT32 (*function)(PLI_BYTE8*))
{
    s_vpi_systf_data data{};
    data.type = type;
    data.sysfunctype = vpiIntFunc;
    data.tfname = text(call.name);
    data.calltf = function;
    data.compiletf = check;
    data.user_data = text(reinterpret_cast<const char*>(&call));
    vpi_register_systf(&data);
}

void announceAll()
{
    announce(createCall, vpiSysFunc, run<create, 0, true>);
    announce(decodeCall, vpiSysFunc, run<decode, 1, true>);
    announce(tagCall, vpiSysFunc, run<tag, 0, true>);
    announce(destroyCall, vpiSysTask, run<destroy, 0, false>);
    announce(createCheckerCall, vpiSysFunc, run<createChecker, 0, true>);
    announce(startCheckerCall, vpiSysFunc, run<startChecker, MORVIK_CHECKER_REFUSED, true>);
    announce(observeCall, vpiSysFunc, run<observe, MORVIK_CHECKER_REFUSED, true>);
    announce(valueCall, vpiSysFunc, run<value, MORVIK_CHECKER_UNKNOWN, true>);
    announce(ratioCall, vpiSysFunc, run<ratio, MORVIK_CHECKER_UNKNOWN, true>);
    announce(reportCall, vpiSysFunc, run<reportBlock, MORVIK_CHECKER_REFUSED, true>);
    announce(countSituationsCall, vpiSysTask, run<countSituations, 0, false>);
    announce(writeSituationsCall, vpiSysFunc, run<writeSituations, MORVIK_CHECKER_REFUSED, true>);
    announce(destroyCheckerCall, vpiSysTask, run<destroyChecker, 0, false>);
    announceUnits();
}

}  // namespace

extern "C" {
/// The simulator calls these after loading the module.
MORVIK_API void (*vlog_startup_routines[])() = {announceAll, nullptr};
}
