// VcdFile: a value change dump (IEEE 1364-2001, clause 18), which waveform viewers read.
#include "VcdFile.h"

#include <cstdio>
#include <utility>

namespace morvik::trace {

namespace {

/// A variable's number as an identifier, in all printable characters.
std::string codeOf(std::size_t number)
{
    constexpr std::size_t characters = '~' - '!' + 1;
    std::string code;
    do {
        code += static_cast<char>('!' + number % characters);
        number /= characters;
    } while (number > 0);
    return code;
}

}  // namespace

VcdFile::VcdFile(base::OutputFile file, const std::string& comment) : itsFile(std::move(file))
{
    append("$comment " + comment + " $end\n$timescale 1 ns $end\n");
}

void VcdFile::beginScope(const std::string& name)
{
    append("$scope module " + name + " $end\n");
}

void VcdFile::endScope()
{
    append("$upscope $end\n");
}

std::size_t VcdFile::addWire(const std::string& name, unsigned bits)
{
    return add("wire " + std::to_string(bits), bits, name + " [" + std::to_string(bits - 1) + ":0]");
}

std::size_t VcdFile::addReal(const std::string& name)
{
    return add("real 64", 0, name);
}

std::size_t VcdFile::add(const std::string& type, unsigned bits, const std::string& name)
{
    itsVariables.push_back({codeOf(itsVariables.size()), bits, std::nullopt});
    append("$var " + type + ' ' + itsVariables.back().code + ' ' + name + " $end\n");
    return itsVariables.size() - 1;
}

void VcdFile::endDeclarations(std::uint64_t time)
{
    append("$enddefinitions $end\n");
    itsTime = time;
    writeTime();
    append("$dumpvars\n");
    for (Variable& variable : itsVariables) {
        if (variable.bits == 0) {
            variable.value = 0;
        }
        writeValue(variable);
    }
    append("$end\n");
}

void VcdFile::beginTime(std::uint64_t time)
{
    itsTimeIsWritten = itsTimeIsWritten && time == itsTime;
    itsTime = time;
}

void VcdFile::setWire(std::size_t variable, std::optional<std::int64_t> value)
{
    if (itsVariables[variable].value == value) {
        return;
    }
    itsVariables[variable].value = value;
    writeTime();
    writeValue(itsVariables[variable]);
}

void VcdFile::setReal(std::size_t variable, std::int64_t eighths)
{
    setWire(variable, eighths);
}

void VcdFile::finish()
{
    writeTime();
    itsFile.write(itsPart);
    itsFile.commit();
}

void VcdFile::writeValue(const Variable& variable)
{
    std::string text;
    if (variable.bits == 0) {
        constexpr double eighth = 0.125;
        char number[32];
        std::snprintf(number, sizeof number, "r%.10g", static_cast<double>(*variable.value) * eighth);
        text = number;
    } else if (!variable.value) {
        text = "bx";
    } else {
        text = "b";
        for (unsigned bit = variable.bits; bit-- > 0;) {
            text += (static_cast<std::uint64_t>(*variable.value) >> bit & 1) != 0 ? '1' : '0';
        }
    }
    append(text + ' ' + variable.code + '\n');
}

void VcdFile::writeTime()
{
    if (!itsTimeIsWritten) {
        append('#' + std::to_string(itsTime) + '\n');
        itsTimeIsWritten = true;
    }
}

void VcdFile::append(std::string_view text)
{
    constexpr std::size_t partSize = 65536;
    itsPart += text;
    if (itsPart.size() >= partSize) {
        itsFile.write(itsPart);
        itsPart.clear();
    }
}

}  // namespace morvik::trace
