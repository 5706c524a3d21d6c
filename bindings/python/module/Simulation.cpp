// Simulation: error rates for the package.
#include "Simulation.h"

#include <pybind11/functional.h>
#include <pybind11/stl.h>

#include <algorithm>
#include <optional>
#include <string>
#include <utility>
#include <vector>

#include "Arrays.h"
#include "Decoder.h"
#include "ErrorRates.h"
#include "base/Error.h"
#include "base/Thousandths.h"
#include "simulation/LinkFormats.h"
#include "simulation/TransportFit.h"
#include "simulation/Warnings.h"

namespace py = pybind11;

namespace morvik::python {

namespace {

/// Adds what the rows of transport blocks and modulated blocks have besides.
void addLinkFields(const simulation::ResultRow& row, py::dict& fields)
{
    const simulation::LinkFormat& link = row.point.link;
    const simulation::Reception reception = simulation::receptionOf(row);
    fields["transport_block_size"] = link.transportBlockSize;
    fields["code_blocks"] = simulation::codeBlocksOf(row.point);
    fields["coded_bits"] = link.codedBits;
    fields["mcs"] = simulation::mcsText(link.mcs);
    fields["modulation"] = nameOf(link.modulation);
    fields["redundancy_versions"] = py::tuple(py::cast(link.versions));
    fields["transmissions"] = std::max<std::size_t>(link.versions.size(), 1);
    fields["soft_buffer_bits"] = link.softBufferBits;
    fields["soft_buffer_size"] = link.softBufferSize;
    fields["channel"] = nameOf(link.fading);
    fields["demapper"] = nameOf(link.demapper);
    fields["early_stop"] = link.stopsEarly ? "crc" : "none";
    fields["axis"] = nameOf(row.point.axis);
    fields["esn0_db"] = base::fromThousandths(simulation::milliEsn0Of(row.point));
    fields["code_block_errors"] = reception.codeBlockErrors;
    fields["undetected_errors"] = reception.undetected;
    fields["sent_transmissions"] = reception.transmissions;
    fields["run_iterations"] = reception.iterations;
    fields["mean_transmissions"] = simulation::meanTransmissions(row);
    fields["mean_iterations"] = simulation::meanIterations(row);
    fields["throughput"] = simulation::throughput(row);
}

/// Named like the columns of result files.
py::dict fieldsOf(const simulation::ResultRow& row, bool isWide)
{
    const simulation::Bounds bits = simulation::bitErrorBounds(row);
    const simulation::Bounds blocks = simulation::blockErrorBounds(row);
    py::dict fields;
    fields["point"] = row.pointNumber;
    fields["block_size"] = row.point.blockSize;
    fields["num_pu"] = row.point.numPu;
    fields["algorithm"] = simulation::algorithmName(row.point.algorithm);
    fields["scale_option"] = simulation::scaleOptionText(row.point.scaleOption);
    fields["iterations"] = row.point.iterations;
    fields["ebn0_db"] = base::fromThousandths(row.point.milliDecibels);
    fields["scale"] = base::fromThousandths(row.point.milliScale);
    fields["frames"] = row.frames.text();
    fields["blocks"] = row.frames.size();
    fields["bit_errors"] = row.errors.bitErrors;
    fields["block_errors"] = row.errors.blockErrors;
    fields["bit_error_squares"] = row.errors.bitErrorSquares;
    fields["ber"] = simulation::bitErrorRate(row);
    fields["ber_low"] = bits.low;
    fields["ber_high"] = bits.high;
    fields["bler"] = simulation::blockErrorRate(row);
    fields["bler_low"] = blocks.low;
    fields["bler_high"] = blocks.high;
    fields["clipped_values"] = row.clipped;
    fields["clipped_fraction"] = simulation::clippedFraction(row);
    fields["failed_frames"] = py::tuple(py::cast(row.errors.failures));
    fields["seconds"] = row.seconds;
    fields["seed"] = row.seed;
    fields["version"] = row.version;
    if (isWide) {
        addLinkFields(row, fields);
    }
    return fields;
}

py::list fieldsOf(const std::vector<simulation::ResultRow>& rows, bool isWide)
{
    py::list list;
    for (const simulation::ResultRow& row : rows) {
        list.append(fieldsOf(row, isWide));
    }
    return list;
}

/// Ctrl-C and Python's other signals end a simulation through their exceptions.
Listeners listenersOf(const py::object& progress, bool isWide)
{
    Listeners listeners;
    listeners.isRunning = [] {
        const py::gil_scoped_acquire locked;
        if (PyErr_CheckSignals() != 0) {
            throw py::error_already_set();
        }
    };
    listeners.hasEnded = [&progress, isWide](const std::vector<simulation::ResultRow>& rows) {
        const py::gil_scoped_acquire locked;
        progress(fieldsOf(rows, isWide));
    };
    return listeners;
}

/// The value that a name stands for; the package has checked it.
template <class Value>
Value named(std::optional<Value> value)
{
    return value.value();
}

/// Sets what is given by name; an empty name is not given.
void setNames(simulation::LinkOptions& options,
              const std::vector<std::string>& modulations,
              const std::string& channel,
              const std::string& demapper,
              const std::string& mcsTable)
{
    options.modulations.clear();
    for (const std::string& name : modulations) {
        options.modulations.push_back(named(link::modulationOf(name)));
    }
    if (!channel.empty()) {
        options.fading = named(link::fadingOf(channel));
    }
    if (!demapper.empty()) {
        options.demapper = named(link::demapperOf(demapper));
    }
    if (!mcsTable.empty()) {
        options.mcsTable = named(simulation::mcsTableOf(mcsTable));
    }
}

/// A sweep with the formats that the options ask for. Throws Refusal with the text of the command.
simulation::Sweep sweepOf(simulation::Sweep sweep, const simulation::LinkOptions& options)
{
    try {
        sweep.formats = formatsOf(options, !sweep.blockSizes.empty());
    } catch (const base::Error& error) {
        throw Refusal(error.what());
    }
    return sweep;
}

void tell(const py::object& warn, const std::string& warning)
{
    if (!warning.empty()) {
        warn(warning);
    }
}

py::list simulate(const simulation::Sweep& sweep,
                  const simulation::LinkOptions& link,
                  const simulation::StopRules& rules,
                  const std::optional<std::pair<std::uint64_t, std::uint64_t>>& frames,
                  bool eachIteration,
                  std::uint64_t seed,
                  unsigned threads,
                  const std::string& instructionSet,
                  const py::object& progress,
                  const py::object& warn)
{
    simulation::Plan plan;
    plan.points = simulation::pointsOf(sweepOf(sweep, link));
    plan.eachIteration = eachIteration;
    plan.rules = rules;
    if (frames) {
        plan.frames = {frames->first, frames->second};
    }
    plan.seed = seed;
    plan.version = MORVIK_VERSION;
    const bool isWide = std::any_of(plan.points.begin(), plan.points.end(), simulation::isWide);
    const Listeners listeners = listenersOf(progress, isWide);
    tell(warn, highRateWarning(plan));
    tell(warn, narrowBufferWarning(plan));
    std::vector<simulation::PointResult> ended;
    {
        const Unlocked unlocked;
        ended = errorRates(plan, threads, instructionSet, listeners);
    }
    if (sweep.milliDecibels.empty()) {
        tell(warn, unfallenWarning(plan, ended));
    }
    return fieldsOf(resultsOf(plan, ended).rows, isWide);
}

void addLinkOptions(py::module_& module)
{
    py::class_<simulation::LinkOptions>(module, "LinkOptions")
        .def(py::init<>())
        .def_readwrite("transport_block_sizes", &simulation::LinkOptions::transportBlockSizes)
        .def_readwrite("coded_bits", &simulation::LinkOptions::codedBits)
        .def_readwrite("code_rates", &simulation::LinkOptions::codeRates)
        .def_readwrite("mcs_indices", &simulation::LinkOptions::mcsIndices)
        .def_readwrite("resource_blocks", &simulation::LinkOptions::resourceBlocks)
        .def_readwrite("resource_elements", &simulation::LinkOptions::resourceElements)
        .def_readwrite("versions", &simulation::LinkOptions::versions)
        .def_readwrite("soft_buffer_bits", &simulation::LinkOptions::softBufferBits)
        .def_readwrite("soft_buffer_size", &simulation::LinkOptions::softBufferSize)
        .def_readwrite("stops_early", &simulation::LinkOptions::stopsEarly)
        .def("set_names",
             setNames,
             py::arg("modulations"),
             py::arg("channel"),
             py::arg("demapper"),
             py::arg("mcs_table"));
}

}  // namespace

void addSimulation(py::module_& module)
{
    py::class_<simulation::Sweep>(module, "Sweep")
        .def(py::init<>())
        .def_readwrite("block_sizes", &simulation::Sweep::blockSizes)
        .def_readwrite("num_pus", &simulation::Sweep::numPus)
        .def_readwrite("algorithms", &simulation::Sweep::algorithms)
        .def_readwrite("milli_scales", &simulation::Sweep::scaleOptions)
        .def_readwrite("iterations", &simulation::Sweep::iterations)
        .def_readwrite("milli_decibels", &simulation::Sweep::milliDecibels)
        .def_property(
            "is_over_esn0",
            [](const simulation::Sweep& sweep) { return sweep.axis == simulation::Axis::esn0; },
            [](simulation::Sweep& sweep, bool isOver) {
                sweep.axis = isOver ? simulation::Axis::esn0 : simulation::Axis::ebn0;
            });
    addLinkOptions(module);
    module.attr("most_coded_bits") = simulation::mostCodedBits;
    py::class_<simulation::StopRules>(module, "StopRules")
        .def(py::init<>())
        .def_readwrite("block_errors", &simulation::StopRules::blockErrors)
        .def_readwrite("bit_errors", &simulation::StopRules::bitErrors)
        .def_readwrite("max_blocks", &simulation::StopRules::maxBlocks)
        .def_readwrite("max_seconds", &simulation::StopRules::maxSeconds)
        .def_readwrite("stop_bler", &simulation::StopRules::stopBler);
    module.def("error_rate",
               simulate,
               py::arg("sweep"),
               py::arg("link"),
               py::arg("rules"),
               py::arg("frames"),
               py::arg("each_iteration"),
               py::arg("seed"),
               py::arg("threads"),
               py::arg("instruction_set"),
               py::arg("progress"),
               py::arg("warn"));
}

}  // namespace morvik::python
