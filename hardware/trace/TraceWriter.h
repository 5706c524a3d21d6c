// TraceWriter: writes the values of passes, one pass after the other.
#ifndef MORVIK_HARDWARE_TRACE_TRACEWRITER_H
#define MORVIK_HARDWARE_TRACE_TRACEWRITER_H

#include <cstdint>
#include <memory>

#include "Selection.h"
#include "hardware/tables/Formats.h"
#include "hardware/testbench/Passes.h"

namespace morvik::trace {

/// Writes passes as they are computed, and keeps at most one. Throws base::Error, prefixed with the file's name.
class TraceWriter {
public:
    virtual ~TraceWriter() = default;

    /// Adds the half-iteration that `passes` has just computed.
    virtual void add(const Passes& passes, std::uint32_t halfIteration) = 0;

    /// Writes the end. Nothing may be added after it.
    virtual void finish() = 0;
};

/// The table that table formats write: half-iteration, place and signals of each trellis step.
tables::Table traceTable(const Selection& selection);

/// Writes the rows of traceTable(), all for `block`.
std::unique_ptr<TraceWriter> tableTrace(std::unique_ptr<tables::TableWriter> table,
                                        std::uint32_t block,
                                        const Selection& selection);

/// Waveforms as a value change dump (IEEE 1364-2001, clause 18).
std::unique_ptr<TraceWriter> vcdTrace(base::OutputFile file, const rules::Cut& cut, const Selection& selection);

/// The same as an FST waveform, by GTKWave's vcd2fst. Throws base::Error if that is not installed.
std::unique_ptr<TraceWriter> fstTrace(base::OutputFile file, const rules::Cut& cut, const Selection& selection);

/// Writes the library's own trace of the selected half-iterations, after the input streams.
void writeText(const SoftBlock& block,
               const veltra_ip_morvik_v1_0_generics& generics,
               const Selection& selection,
               base::OutputFile file);

}  // namespace morvik::trace

#endif
