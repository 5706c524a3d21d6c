// VcdTrace: a trace as waveforms, with a scope for each unit and thread.
#include <optional>
#include <string>
#include <utility>
#include <vector>

#include "TraceWriter.h"
#include "VcdFile.h"

namespace morvik::trace {

namespace {

/// All segments advance in parallel, as the hardware's threads do. A pass takes as many times as a segment and the tail
/// have steps.
class VcdTrace : public TraceWriter {
public:
    VcdTrace(base::OutputFile file, const rules::Cut& cut, Selection selection)
        : itsSelection(std::move(selection)),
          itsLength(cut.segmentLength() + rules::tailSteps),
          itsFile(std::move(file),
                  "A unit of time is a trellis step of every segment; half-iteration h begins at h * " +
                      std::to_string(itsLength) + '.')
    {
        declare(cut);
        itsFile.endDeclarations(std::uint64_t{itsSelection.first} * itsLength);
    }

    void add(const Passes& passes, std::uint32_t halfIteration) override
    {
        for (std::uint32_t time = 0; time < itsLength; ++time) {
            itsFile.beginTime(std::uint64_t{halfIteration} * itsLength + time);
            itsFile.setWire(itsHalfIteration, halfIteration);
            itsFile.setWire(itsCode, constituentCode(halfIteration));
            for (const Thread& thread : itsThreads) {
                setThread(passes, thread, time);
            }
        }
    }

    void finish() override
    {
        itsFile.beginTime((std::uint64_t{itsSelection.last} + 1) * itsLength);
        itsFile.finish();
    }

private:
    struct Signal {
        std::size_t wire;
        std::size_t real;
    };

    /// The variables of a thread, and the segment that it works on.
    struct Thread {
        std::uint32_t segment;
        std::size_t step;
        std::size_t window;
        std::vector<Signal> signals;
    };

    void declare(const rules::Cut& cut)
    {
        itsFile.beginScope("morvik");
        itsHalfIteration = itsFile.addWire("half_iteration", 5);
        itsCode = itsFile.addWire("code", 2);
        for (std::uint32_t segment = 0; segment < cut.segments(); ++segment) {
            const rules::StepPlace place = cut.placeOf(segment * cut.segmentLength());
            if (!itsSelection.showsUnit(place.unit)) {
                continue;
            }
            if (place.thread == 0) {
                itsFile.beginScope("unit" + std::to_string(place.unit));
            }
            declareThread(place);
            if (place.thread + 1 == cut.segmentsOfUnit()) {
                itsFile.endScope();
            }
        }
        itsFile.endScope();
    }

    void declareThread(const rules::StepPlace& place)
    {
        itsFile.beginScope("thread" + std::to_string(place.thread));
        Thread thread = {place.segment, itsFile.addWire("step", 13), itsFile.addWire("window", 4), {}};
        for (const unsigned signal : itsSelection.signals) {
            const std::string name = passSignals[signal].name;
            thread.signals.push_back({itsFile.addWire(name, passBits), itsFile.addReal(name + "_real")});
        }
        itsThreads.push_back(thread);
        itsFile.endScope();
    }

    /// After the end of its segment, a thread has values in the tail only. Reals cannot be unknown and keep their last
    /// value.
    void setThread(const Passes& passes, const Thread& thread, std::uint32_t time)
    {
        const rules::Cut& cut = passes.cut();
        const bool works = time < cut.segmentLength() || thread.segment + 1 == cut.segments();
        const std::uint32_t step = thread.segment * cut.segmentLength() + time;
        itsFile.setWire(thread.step, works ? std::optional<std::int64_t>(step) : std::nullopt);
        itsFile.setWire(thread.window, works ? std::optional<std::int64_t>(cut.placeOf(step).row) : std::nullopt);
        for (std::size_t i = 0; i < thread.signals.size(); ++i) {
            const unsigned signal = itsSelection.signals[i];
            if (!works || !passes.isComputed(signal, step)) {
                itsFile.setWire(thread.signals[i].wire, std::nullopt);
                continue;
            }
            itsFile.setWire(thread.signals[i].wire, passes.value(signal, step));
            itsFile.setReal(thread.signals[i].real, passes.value(signal, step));
        }
    }

    Selection itsSelection;
    std::uint32_t itsLength;
    VcdFile itsFile;
    std::size_t itsHalfIteration = 0;
    std::size_t itsCode = 0;
    std::vector<Thread> itsThreads;
};

}  // namespace

std::unique_ptr<TraceWriter> vcdTrace(base::OutputFile file, const rules::Cut& cut, const Selection& selection)
{
    return std::make_unique<VcdTrace>(std::move(file), cut, selection);
}

}  // namespace morvik::trace
