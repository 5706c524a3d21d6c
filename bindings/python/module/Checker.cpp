// Checker: the checker of a simulation, for the package.
#include "Checker.h"

#include <pybind11/stl.h>

#include <cstdint>
#include <memory>
#include <new>
#include <optional>
#include <string>
#include <utility>
#include <vector>

#include "Arrays.h"
#include "Decoder.h"
#include "ThreadMessages.h"
#include "hardware/testbench/Signals.h"
#include "morvik_checker.h"

namespace py = pybind11;

namespace morvik::python {

namespace {

/// "ERROR:checker:text" without what stands before the text.
std::string withoutPrefix(const std::string& message)
{
    return message.substr(message.find(':', message.find(':') + 1) + 1);
}

std::optional<int> known(std::int32_t value)
{
    return value == MORVIK_CHECKER_UNKNOWN ? std::nullopt : std::optional<int>(value);
}

/// A checker of the C interface. Calls keep the interpreter lock.
class Checker {
public:
    /// Throws Refusal.
    Checker(std::int32_t numPu, std::int32_t algorithm, bool countsSituations)
    {
        takeMessages();  // left from a call that ended with an exception
        itsChecker.reset(morvik_checker_create(numPu, algorithm));
        if (!itsChecker) {
            throw std::bad_alloc();
        }
        if (morvik_checker_is_open(itsChecker.get()) == 0) {
            throw Refusal(takeMessages().error);
        }
        if (countsSituations) {
            expectTaken(morvik_checker_count_situations(itsChecker.get()));
        }
    }

    /// Returns the warnings. Throws Refusal.
    std::vector<std::string> start(const Array<std::int32_t>& sys,
                                   const Array<std::int32_t>& par1,
                                   const Array<std::int32_t>& par2,
                                   std::int32_t iterations)
    {
        takeMessages();
        for (py::ssize_t i = 0; i < sys.size(); ++i) {
            morvik_checker_put(itsChecker.get(), sys.data()[i], par1.data()[i], par2.data()[i]);
        }
        expectTaken(morvik_checker_start(itsChecker.get(), iterations));
        return takeMessages().warnings;
    }

    /// Whether the values agree, and what there is to say. Several values are a row. Throws Refusal.
    std::pair<bool, std::string> observe(std::int32_t signal,
                                         std::int32_t halfIteration,
                                         std::int32_t step,
                                         const std::vector<std::optional<std::int32_t>>& given)
    {
        std::vector<std::int32_t> values;
        values.reserve(given.size());
        for (const auto& value : given) {
            values.push_back(value.value_or(MORVIK_CHECKER_UNKNOWN));
        }
        const std::int32_t answer =
            values.size() > 1 ? morvik_checker_observe_row(itsChecker.get(), signal, halfIteration, step, values.data())
                              : morvik_checker_observe(itsChecker.get(), signal, halfIteration, step, values.at(0));
        if (answer != MORVIK_CHECKER_AGREES && answer != MORVIK_CHECKER_DIFFERS) {
            expectTaken(answer);
        }
        const bool agrees = answer == MORVIK_CHECKER_AGREES;
        return {agrees, agrees ? std::string() : message()};
    }

    /// Nothing where the core computes none. Throws Refusal.
    std::optional<int> value(std::int32_t signal, std::int32_t halfIteration, std::int32_t step)
    {
        const auto found = known(morvik_checker_value(itsChecker.get(), signal, halfIteration, step));
        if (const std::string text = message(); !text.empty()) {
            throw Refusal(text);
        }
        return found;
    }

    /// All values of a signal: those of a half-iteration in a row. Throws Refusal.
    Array<std::int16_t> values(std::int32_t signal, py::ssize_t passes)
    {
        value(signal, 0, 0);
        const py::ssize_t steps = morvik_checker_expected(itsChecker.get(), signal) / passes;
        Array<std::int16_t> all({passes, steps});
        for (py::ssize_t i = 0; i < all.size(); ++i) {
            all.mutable_data()[i] = static_cast<std::int16_t>(morvik_checker_value(
                itsChecker.get(), signal, static_cast<std::int32_t>(i / steps), static_cast<std::int32_t>(i % steps)));
        }
        return all;
    }

    std::pair<std::int32_t, std::int32_t> seen(std::int32_t signal) const
    {
        return {morvik_checker_seen(itsChecker.get(), signal), morvik_checker_expected(itsChecker.get(), signal)};
    }

    std::int32_t standing() const
    {
        return morvik_checker_standing(itsChecker.get());
    }

    /// Throws Refusal.
    std::string report()
    {
        return given(morvik_checker_report(itsChecker.get()));
    }

    /// Throws Refusal.
    std::string situations()
    {
        return given(morvik_checker_situations(itsChecker.get()));
    }

private:
    struct Destroy {
        void operator()(morvik_checker* checker) const
        {
            morvik_checker_destroy(checker);
        }
    };

    std::string message()
    {
        return withoutPrefix(morvik_checker_message(itsChecker.get()));
    }

    /// The text, unless it is empty, as after a refusal.
    std::string given(std::string text)
    {
        if (text.empty()) {
            throw Refusal(message());
        }
        return text;
    }

    void expectTaken(std::int32_t answer)
    {
        if (answer == MORVIK_CHECKER_OUT_OF_MEMORY) {
            throw std::bad_alloc();
        }
        if (answer != MORVIK_CHECKER_AGREES) {
            const std::string text = message();
            throw Refusal(text.empty() ? takeMessages().error : text);
        }
    }

    std::unique_ptr<morvik_checker, Destroy> itsChecker;
};

}  // namespace

void addChecker(py::module_& module)
{
    py::tuple names(signalCount);
    for (unsigned signal = 0; signal < signalCount; ++signal) {
        names[signal] = passSignals[signal].name;
    }
    module.attr("signals") = names;
    py::class_<Checker> checker(module, "Checker");
    checker.def(py::init<std::int32_t, std::int32_t, bool>(),
                py::arg("num_pu"),
                py::arg("algorithm"),
                py::arg("count_situations"));
    checker.def("start",
                &Checker::start,
                py::arg("sys").noconvert(),
                py::arg("par1").noconvert(),
                py::arg("par2").noconvert(),
                py::arg("iterations"));
    checker.def(
        "observe", &Checker::observe, py::arg("signal"), py::arg("half_iteration"), py::arg("step"), py::arg("values"));
    checker.def("value", &Checker::value, py::arg("signal"), py::arg("half_iteration"), py::arg("step"));
    checker.def("values", &Checker::values, py::arg("signal"), py::arg("half_iterations"));
    checker.def("seen", &Checker::seen, py::arg("signal"));
    checker.def("standing", &Checker::standing);
    checker.def("report", &Checker::report);
    checker.def("situations", &Checker::situations);
}

}  // namespace morvik::python
