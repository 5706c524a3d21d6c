// morvik_unit_mex: what the functions morvik_unit_*.m call: the units of include/morvik_units.h. Octave and MATLAB
// build it alike.
//
//     [status, text, number, results] = morvik_unit_mex(unit, algorithm, input, ...)
//
// A case is a column. The callers have checked classes and sizes: the algorithm is a double, 0 to 2, the inputs are
// int32, with as many rows as the unit takes and equal numbers of columns. Results are int16, all of a case in one
// column. They also raise errors, from the status of the C interface and the number of the case that was refused,
// counted from 1: an interpreter's functions for it would leave without destroying anything.
#include <mex.h>

#include <algorithm>
#include <array>
#include <cstddef>
#include <cstdint>
#include <cstring>
#include <exception>

#include "morvik_units.h"

namespace {

constexpr std::size_t mostInputs = 3;
constexpr std::size_t states = 8;

/// The results of a case, metrics before the corrections pending with them.
using Values = std::array<std::int32_t, 2 * states>;

/// Where the values of each input begin, for one case.
using Inputs = std::array<const std::int32_t*, mostInputs>;

struct Unit {
    const char* name;
    std::size_t results;
    std::int32_t (*compute)(std::int32_t algorithm, const Inputs& inputs, std::int32_t* results);
};

constexpr std::array<Unit, 9> allUnits = {{
    {"intrinsic",
     1,
     [](std::int32_t /*algorithm*/, const Inputs& in, std::int32_t* out) {
         return morvik_unit_intrinsic(*in[0], *in[1], out);
     }},
    {"branch",
     4,
     [](std::int32_t /*algorithm*/, const Inputs& in, std::int32_t* out) {
         return morvik_unit_branch(*in[0], *in[1], out);
     }},
    {"forward",
     2 * states,
     [](std::int32_t algorithm, const Inputs& in, std::int32_t* out) {
         return morvik_unit_forward(algorithm, in[0], in[1], in[2], out, out + states);
     }},
    {"backward",
     2 * states,
     [](std::int32_t algorithm, const Inputs& in, std::int32_t* out) {
         return morvik_unit_backward(algorithm, in[0], in[1], in[2], out, out + states);
     }},
    {"ratio",
     1,
     [](std::int32_t algorithm, const Inputs& in, std::int32_t* out) {
         return morvik_unit_ratio(algorithm, in[0], in[1], in[2], out);
     }},
    {"extrinsic",
     1,
     [](std::int32_t algorithm, const Inputs& in, std::int32_t* out) {
         return morvik_unit_extrinsic(algorithm, *in[0], *in[1], out);
     }},
    {"address",
     1,
     [](std::int32_t /*algorithm*/, const Inputs& in, std::int32_t* out) {
         return morvik_unit_address(*in[0], *in[1], out);
     }},
    {"tail",
     states,
     [](std::int32_t /*algorithm*/, const Inputs& in, std::int32_t* out) {
         return morvik_unit_tail(in[0], in[1], out);
     }},
    {"border",
     states,
     [](std::int32_t /*algorithm*/, const Inputs& in, std::int32_t* out) {
         return morvik_unit_border(in[0], out);
     }},
}};

struct Answer {
    std::int32_t status = MORVIK_UNIT_OK;
    std::size_t number = 0;  ///< of the case that was refused, from 1
};

/// Computes cases until one is refused.
Answer compute(
    const Unit& unit, std::int32_t algorithm, const mxArray* const* inputs, std::size_t count, mxArray* results)
{
    auto* to = static_cast<std::int16_t*>(mxGetData(results));
    for (std::size_t number = 1; number <= mxGetN(results); ++number) {
        Inputs values{};
        for (std::size_t i = 0; i < count; ++i) {
            values[i] = static_cast<const std::int32_t*>(mxGetData(inputs[i])) + (number - 1) * mxGetM(inputs[i]);
        }
        Values computed{};
        const std::int32_t status = unit.compute(algorithm, values, computed.data());
        if (status != MORVIK_UNIT_OK) {
            return {status, number};
        }
        to = std::transform(computed.data(), computed.data() + unit.results, to, [](std::int32_t value) {
            return static_cast<std::int16_t>(value);
        });
    }
    return {};
}

Answer compute(mxArray*& results, const mxArray* const* arguments, std::size_t count)
{
    std::array<char, 20> name{};
    mxGetString(arguments[0], name.data(), static_cast<mwSize>(name.size()));
    const auto* const unit = std::find_if(
        allUnits.begin(), allUnits.end(), [&](const Unit& each) { return std::strcmp(each.name, name.data()) == 0; });
    const auto algorithm = static_cast<std::int32_t>(mxGetScalar(arguments[1]));
    results = mxCreateNumericMatrix(static_cast<mwSize>(unit->results), mxGetN(arguments[2]), mxINT16_CLASS, mxREAL);
    return compute(*unit, algorithm, arguments + 2, count - 2, results);
}

}  // namespace

void mexFunction(int, mxArray* plhs[], int nrhs, const mxArray* prhs[])
{
    Answer answer;
    try {
        answer = compute(plhs[3], prhs, static_cast<std::size_t>(nrhs));
    } catch (const std::exception&) {
        answer = {MORVIK_UNIT_OUT_OF_MEMORY, 0};
    }
    plhs[0] = mxCreateDoubleScalar(answer.status);
    plhs[1] = mxCreateString(morvik_unit_status_text(answer.status));
    plhs[2] = mxCreateDoubleScalar(static_cast<double>(answer.number));
}
