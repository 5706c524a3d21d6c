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

/// Writes declarations, then times in ascending order, each with the values that change. Setting a value to what it was
/// writes nothing.
class VcdFile {
public:
    VcdFile(base::OutputFile file, const std::string& comment);

    void beginScope(const std::string& name);
    void endScope();

    /// Declare a variable and return its number, from 0 upwards.
    std::size_t addWire(const std::string& name, unsigned bits);
    std::size_t addReal(const std::string& name);

    /// Ends the declarations: wires start unknown, reals at 0.
    void endDeclarations(std::uint64_t time);

    void beginTime(std::uint64_t time);

    /// Sets a wire, in two's complement; nothing means unknown.
    void setWire(std::size_t variable, std::optional<std::int64_t> value);

    /// Sets a real, in eighths.
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
    std::string itsPart;  // text not yet written
    std::vector<Variable> itsVariables;
    std::uint64_t itsTime = 0;
    bool itsTimeIsWritten = false;
};

}  // namespace morvik::trace

#endif
