// VcdFile: a value change dump (IEEE 1364-2001, clause 18), which waveform viewers read.
#ifndef MORVIK_HARDWARE_TRACE_VCDFILE_H
#define MORVIK_HARDWARE_TRACE_VCDFILE_H

#include <cstddef>
#include <cstdint>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

#include "base/OutputFile.h"

namespace morvik::trace {

/// Declarations first, then times in ascending order, each with the values that change there. A value that is set again
/// as it was takes no room.
class VcdFile {
public:
    VcdFile(base::OutputFile file, const std::string& comment);

    void beginScope(const std::string& name);
    void endScope();

    /// Declare a variable and return its number, from 0 upwards.
    std::size_t addWire(const std::string& name, unsigned bits);
    std::size_t addReal(const std::string& name);

    /// Ends the declarations: wires have unknown values, reals are 0.
    void endDeclarations(std::uint64_t time);

    void beginTime(std::uint64_t time);

    /// The value of a wire in two's complement, unknown if there is none.
    void setWire(std::size_t variable, std::optional<std::int64_t> value);

    /// The value of a real in eighths.
    void setReal(std::size_t variable, std::int64_t eighths);

    void finish();

private:
    struct Variable {
        std::string code;
        unsigned bits;  ///< 0 for a real
        std::optional<std::int64_t> value;
    };

    std::size_t add(const std::string& type, unsigned bits, const std::string& name);
    void writeValue(const Variable& variable);
    void writeTime();
    void append(std::string_view text);

    base::OutputFile itsFile;
    std::string itsPart;  // of the text, that is not written yet
    std::vector<Variable> itsVariables;
    std::uint64_t itsTime = 0;
    bool itsTimeIsWritten = false;
};

}  // namespace morvik::trace

#endif
