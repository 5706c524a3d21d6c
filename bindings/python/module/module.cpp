// module: the extension `morvik._core`, the base of the package `morvik`. It relies on the package's checks of numbers
// and shapes.
#include <pybind11/functional.h>
#include <pybind11/numpy.h>
#include <pybind11/pybind11.h>
#include <pybind11/stl.h>

#include <iterator>
#include <optional>
#include <utility>

#include "Arrays.h"
#include "Decoder.h"
#include "ErrorRates.h"
#include "Link.h"
#include "Lte.h"
#include "base/Error.h"
#include "base/Thousandths.h"
#include "rules/Tail.h"
#include "src/InstructionSetNames.h"

namespace py = pybind11;
using namespace morvik::python;

namespace {

// ---- Decoding

/// Returns status, error text, warnings, bits, kept tags, and ratios or None.
template <class Input>
py::tuple decode(Decoder& decoder,
                 const Array<Input>& sys,
                 const Array<Input>& par1,
                 const Array<Input>& par2,
                 std::uint32_t iterations,
                 const Array<std::uint32_t>& tags,
                 bool wantsRatios,
                 unsigned threads)
{
    const py::ssize_t blocks = tags.size();
    const py::ssize_t positions = sys.shape(1);
    Array<std::uint8_t> bits({blocks, positions - morvik::rules::tailPositions});
    Array<std::uint32_t> keptTags(blocks);
    std::optional<Array<std::int16_t>> ratios;
    if (wantsRatios) {
        ratios.emplace(std::vector{blocks, positions - morvik::rules::tailPositions});
    }

    Batch<Input> batch;
    batch.streams = {sys.data(), par1.data(), par2.data()};
    batch.positions = static_cast<std::int32_t>(positions);
    batch.blocks = static_cast<std::uint32_t>(blocks);
    batch.iterations = iterations;
    batch.tags = tags.data();
    batch.bits = bits.mutable_data();
    batch.ratios = ratios ? ratios->mutable_data() : nullptr;
    batch.keptTags = keptTags.mutable_data();
    Outcome outcome;
    {
        const Unlocked unlocked;
        outcome = decoder.decode(batch, threads);
    }
    return py::make_tuple(outcome.status, outcome.messages.error, outcome.messages.warnings, bits, keptTags, ratios);
}

template <class Input>
void addDecode(py::class_<Decoder>& decoder)
{
    decoder.def("decode",
                decode<Input>,
                py::arg("sys").noconvert(),
                py::arg("par1").noconvert(),
                py::arg("par2").noconvert(),
                py::arg("iterations"),
                py::arg("tags").noconvert(),
                py::arg("wants_ratios"),
                py::arg("threads"));
}

void addDecoder(py::module_& module)
{
    const veltra_ip_morvik_v1_0_generics usual = veltra_ip_morvik_v1_0_get_default_generics();
    py::tuple names(std::size(morvik::instructionSetNames));
    for (std::size_t i = 0; i < names.size(); ++i) {
        names[i] = morvik::instructionSetNames[i];
    }
    module.attr("instruction_sets") = names;
    module.attr("default_num_pu") = usual.C_NUM_PU;
    module.attr("default_algorithm") = usual.C_ALGORITHM_TYPE;
    module.attr("default_tag_width") = usual.C_TAG_WIDTH;
    py::register_exception<Refusal>(module, "Error", PyExc_ValueError);
    py::class_<Decoder> decoder(module, "Decoder");
    decoder.def(py::init<std::int32_t, std::int32_t, std::int32_t, std::string>(),
                py::arg("num_pu"),
                py::arg("algorithm"),
                py::arg("tag_width"),
                py::arg("instruction_set"));
    addDecode<std::int8_t>(decoder);
    addDecode<std::int16_t>(decoder);
    addDecode<std::int32_t>(decoder);
    // Each of these may wait for a decoding thread.
    const py::call_guard<Unlocked> unlocked;
    decoder.def("close", &Decoder::close, unlocked);
    decoder.def_property_readonly("closed", py::cpp_function(&Decoder::isClosed, unlocked));
    decoder.def_property_readonly("instruction_set", py::cpp_function(&Decoder::instructionSet, unlocked));
}

// ---- Simulation

/// Named like the columns of result files.
py::dict fields(const morvik::simulation::ResultRow& row)
{
    const morvik::simulation::Bounds bits = morvik::simulation::bitErrorBounds(row);
    const morvik::simulation::Bounds blocks = morvik::simulation::blockErrorBounds(row);
    py::dict fields;
    fields["point"] = row.pointNumber;
    fields["block_size"] = row.point.blockSize;
    fields["num_pu"] = row.point.numPu;
    fields["algorithm"] = morvik::simulation::algorithmName(row.point.algorithm);
    fields["scale_option"] = morvik::simulation::scaleOptionText(row.point.scaleOption);
    fields["iterations"] = row.point.iterations;
    fields["ebn0_db"] = morvik::base::fromThousandths(row.point.milliDecibels);
    fields["scale"] = morvik::base::fromThousandths(row.point.milliScale);
    fields["frames"] = row.frames.text();
    fields["blocks"] = row.frames.size();
    fields["bit_errors"] = row.errors.bitErrors;
    fields["block_errors"] = row.errors.blockErrors;
    fields["bit_error_squares"] = row.errors.bitErrorSquares;
    fields["ber"] = morvik::simulation::bitErrorRate(row);
    fields["ber_low"] = bits.low;
    fields["ber_high"] = bits.high;
    fields["bler"] = morvik::simulation::blockErrorRate(row);
    fields["bler_low"] = blocks.low;
    fields["bler_high"] = blocks.high;
    fields["clipped_values"] = row.clipped;
    fields["clipped_fraction"] = morvik::simulation::clippedFraction(row);
    fields["failed_frames"] = py::tuple(py::cast(row.errors.failures));
    fields["seconds"] = row.seconds;
    fields["seed"] = row.seed;
    fields["version"] = row.version;
    return fields;
}

py::list fieldsOf(const std::vector<morvik::simulation::ResultRow>& rows)
{
    py::list list;
    for (const morvik::simulation::ResultRow& row : rows) {
        list.append(fields(row));
    }
    return list;
}

/// Ctrl-C and Python's other signals end a simulation through their exceptions.
Listeners listenersOf(const py::object& progress)
{
    Listeners listeners;
    listeners.isRunning = [] {
        const py::gil_scoped_acquire locked;
        if (PyErr_CheckSignals() != 0) {
            throw py::error_already_set();
        }
    };
    listeners.hasEnded = [&progress](const std::vector<morvik::simulation::ResultRow>& rows) {
        const py::gil_scoped_acquire locked;
        progress(fieldsOf(rows));
    };
    return listeners;
}

py::list simulate(const morvik::simulation::Sweep& sweep,
                  const morvik::simulation::StopRules& rules,
                  bool eachIteration,
                  std::uint64_t seed,
                  unsigned threads,
                  const std::string& instructionSet,
                  const py::object& progress)
{
    morvik::simulation::Plan plan;
    plan.points = morvik::simulation::pointsOf(sweep);
    plan.eachIteration = eachIteration;
    plan.rules = rules;
    plan.seed = seed;
    plan.version = MORVIK_VERSION;
    const Listeners listeners = listenersOf(progress);
    std::vector<morvik::simulation::ResultRow> rows;
    {
        const Unlocked unlocked;
        rows = errorRates(plan, threads, instructionSet, listeners);
    }
    return fieldsOf(rows);
}

void addSimulation(py::module_& module)
{
    py::class_<morvik::simulation::Sweep>(module, "Sweep")
        .def(py::init<>())
        .def_readwrite("block_sizes", &morvik::simulation::Sweep::blockSizes)
        .def_readwrite("num_pus", &morvik::simulation::Sweep::numPus)
        .def_readwrite("algorithms", &morvik::simulation::Sweep::algorithms)
        .def_readwrite("milli_scales", &morvik::simulation::Sweep::scaleOptions)
        .def_readwrite("iterations", &morvik::simulation::Sweep::iterations)
        .def_readwrite("milli_decibels", &morvik::simulation::Sweep::milliDecibels);
    py::class_<morvik::simulation::StopRules>(module, "StopRules")
        .def(py::init<>())
        .def_readwrite("block_errors", &morvik::simulation::StopRules::blockErrors)
        .def_readwrite("bit_errors", &morvik::simulation::StopRules::bitErrors)
        .def_readwrite("max_blocks", &morvik::simulation::StopRules::maxBlocks)
        .def_readwrite("max_seconds", &morvik::simulation::StopRules::maxSeconds)
        .def_readwrite("stop_bler", &morvik::simulation::StopRules::stopBler);
    module.def("error_rate",
               simulate,
               py::arg("sweep"),
               py::arg("rules"),
               py::arg("each_iteration"),
               py::arg("seed"),
               py::arg("threads"),
               py::arg("instruction_set"),
               py::arg("progress"));
}

/// Whether the interpreter is the main one of the process; if not, an ImportError is set. In another one, pybind11
/// would wait for the lock that its own thread holds.
bool isMainInterpreter()
{
    if (PyInterpreterState_Get() == PyInterpreterState_Main()) {
        return true;
    }
    PyErr_SetString(PyExc_ImportError, "morvik works in the main interpreter alone, not in a subinterpreter");
    return false;
}

/// For a module that another interpreter has already loaded. A plain function: one of pybind11 would wait as well.
PyObject* expectMainInterpreter(PyObject*, PyObject*)
{
    if (!isMainInterpreter()) {
        return nullptr;
    }
    Py_RETURN_NONE;
}

PyMethodDef plainFunctions[] = {{"expect_main_interpreter", expectMainInterpreter, METH_NOARGS, nullptr}, {}};

}  // namespace

// pybind11's own entry point runs after a check, since it waits before it initialises the module.
#define PyInit__core initialiseCore
PYBIND11_MODULE(_core, module)
{
    module.attr("__version__") = MORVIK_VERSION;
    if (PyModule_AddFunctions(module.ptr(), plainFunctions) != 0) {
        throw py::error_already_set();
    }
    addDecoder(module);
    addLink(module);
    addLte(module);
    addSimulation(module);
}
#undef PyInit__core

// NOLINTNEXTLINE(bugprone-reserved-identifier): Python asks for this name.
extern "C" PYBIND11_EXPORT PyObject* PyInit__core()
{
    return isMainInterpreter() ? initialiseCore() : nullptr;
}
