// TraceReader: reads the values of the model's trace.
#ifndef MORVIK_TESTS_SUPPORT_TRACEREADER_H
#define MORVIK_TESTS_SUPPORT_TRACEREADER_H

#include <array>
#include <cstddef>
#include <cstdint>
#include <istream>
#include <optional>
#include <string>
#include <string_view>

namespace morvik::support {

/// The signals of a trellis step in the order of the trace: intrinsic value, forward and backward metrics, elements 4
/// to 7 of the branch metric column, log-likelihood ratio, extrinsic value.
constexpr std::array<const char*, 23> traceSignals = {"int", "a0", "a1", "a2", "a3", "a4",  "a5", "a6",
                                                      "a7",  "b0", "b1", "b2", "b3", "b4",  "b5", "b6",
                                                      "b7",  "g4", "g5", "g6", "g7", "llr", "ext"};

/// Steps in 1: values are in steps (eighths) of the state metrics' format, -2048 to 2047.
constexpr int traceStepsInOne = 8;

/// The values of one trellis step of a pass.
struct TraceStep {
    std::uint64_t decode = 0;         ///< decodes completed by the state before
    std::uint32_t halfIteration = 0;  ///< the pass, from 0
    std::uint32_t step = 0;           ///< the trellis step, from 0 to K + 2
    std::array<std::int16_t, traceSignals.size()> values = {};
};

/// Reads one trellis step at a time, so that memory does not grow with the trace.
///
/// Skips input streams, headings and warnings between the rows. Throws base::Error, whose message begins with the
/// place, NAME:LINE, for anything that is not a trace.
class TraceReader {
public:
    /// `input` must outlive the reader; `name` names it in messages.
    TraceReader(std::istream& input, std::string name);

    /// Reads the next trellis step; returns false at the end.
    bool next(TraceStep& step);

private:
    [[noreturn]] void fail(const std::string& what) const;
    void beginPass();
    void readRow(TraceStep& step) const;

    std::istream& itsInput;
    std::string itsName;
    std::string itsLine;
    std::size_t itsNumber = 0;         // of the line, from 1
    std::optional<TraceStep> itsPass;  // the pass, and the step of its next row
};

}  // namespace morvik::support

#endif
