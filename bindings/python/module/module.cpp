// module: the extension `morvik._core`, the base of the package `morvik`. It relies on the package's checks of numbers
// and shapes.
#include <pybind11/numpy.h>
#include <pybind11/pybind11.h>
#include <pybind11/stl.h>

#include <iterator>
#include <optional>
#include <utility>

#include "Arrays.h"
#include "Checker.h"
#include "Decoder.h"
#include "Link.h"
#include "Lte.h"
#include "Simulation.h"
#include "Units.h"
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

// ---- The module

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
    addChecker(module);
    addLink(module);
    addLte(module);
    addSimulation(module);
    addUnits(module);
}
#undef PyInit__core

// NOLINTNEXTLINE(bugprone-reserved-identifier): Python asks for this name.
extern "C" PYBIND11_EXPORT PyObject* PyInit__core()
{
    return isMainInterpreter() ? initialiseCore() : nullptr;
}
