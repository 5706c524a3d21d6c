#!/usr/bin/env python3
"""Writes the model's sources with a fault in each copy.

  faults.py SOURCES OUT

For each fault, OUT/NAME/ receives the unit to compile and, where the fault is in a header, that header. Prints a line
"NAME UNIT" for each.
"""

import pathlib
import sys

DECODER = "src/TDecoder3G.cpp"
SEGMENTS = "src/TDecoder3GPU.cpp"
ENGINE = "src/TCalculationEngineModBase.cpp"

# Name: the unit, the file that is changed, and pairs of what stands there and what is put in its place.
FAULTS = {
    "extrinsic_rounding": (DECODER, DECODER, [("value * scale;", "value * scale + 8;")]),
    "intrinsic_rounding": (DECODER, DECODER, [("((apriori / 2) & stateMask)", "((apriori / 2 + 15) & stateMask)")]),
    "extrinsic_unscaled": (DECODER, DECODER, [("value * scale;", "value * (scale < 1 ? 1 : scale);")]),
    "extrinsic_unclipped": (DECODER, DECODER, [("shiftRight(branch.itsMin, spareBits)", "-32768"),
                                               ("shiftRight(branch.itsMax, spareBits)", "32767"),
                                               ("const std::uint32_t spareBits = state.itsNBits - branch.itsNBits;",
                                                "static_cast<void>(branch);")]),
    "extrinsic_sign": (DECODER, DECODER, [("maskBits(wrap16(extrinsic), mask)", "maskBits(wrap16(-extrinsic), mask)")]),
    "extrinsic_stuck_bit": (DECODER, DECODER, [
        ("maskBits(wrap16(extrinsic), mask)",
         "maskBits(wrap16(j >= 64 && j < 128 ? extrinsic | 16 : extrinsic), mask)")]),
    "apriori_late": (DECODER, DECODER, [
        ("    const int mask = itsEngine->itsStateFormat->itsMask;\n    for",
         "    const int mask = itsEngine->itsStateFormat->itsMask;\n"
         "    static std::vector<std::vector<short>> held;\n"
         "    held.resize(h);\n    held.push_back(itsExtrinsic);\n    for"),
        ("j < K ? itsExtrinsic[from[j]] : 0", "j < K && h >= 2 ? held[h - 2][from[j]] : 0")]),
    "apriori_before": (DECODER, DECODER, [
        ("    const int mask = itsEngine->itsStateFormat->itsMask;\n    for",
         "    const int mask = itsEngine->itsStateFormat->itsMask;\n"
         "    static std::vector<std::vector<short>> held;\n"
         "    held.resize(h);\n    held.push_back(itsExtrinsic);\n    for"),
        ("j < K ? itsExtrinsic[from[j]] : 0", "j < K && h >= 1 ? held[h - 1][from[j]] : 0")]),
    "apriori_missing": (DECODER, DECODER, [("j < K ? itsExtrinsic[from[j]] : 0", "from[j % K] > K ? 1 : 0")]),
    "apriori_unpermuted": (DECODER, DECODER, [("j < K ? itsExtrinsic[from[j]]", "j < K && from[j] < K ? itsExtrinsic[j]")]),
    "apriori_inverse": (DECODER, DECODER, [
        ("const std::vector<unsigned>& from = permutation(d);",
         "const std::vector<unsigned>& from = preparePermutation(1 - d, K) ? permutation(1 - d) : permutation(d);")]),
    "apriori_behind": (DECODER, DECODER, [("itsExtrinsic[from[j]]", "itsExtrinsic[from[(j + 1) % K]]")]),
    "systematic_unpermuted": (DECODER, DECODER, [("itsSys[0][itsInterleaver->itsPi[i]]", "itsSys[0][i]")]),
    "branch_unclipped": (ENGINE, ENGINE, [("wrap16(arithmetic::clip(sums[i], lo, hi))",
                                           "wrap16(lo < hi ? sums[i] : 0)")]),
    "branch_eight_bits": (ENGINE, ENGINE, [("wrap16(arithmetic::clip(sums[i], lo, hi))",
                                            "wrap16(lo < hi ? static_cast<signed char>(sums[i] / 16) * 16 : 0)")]),
    "parity_sign": (ENGINE, ENGINE, [("2 * intrinsic[k], parity0[k]", "2 * intrinsic[k], -parity0[k]")]),
    "metrics_unwrapped": (ENGINE, "rules/Arithmetic.h", [
        ("return wrap16(std::int32_t{a} + b);",
         "const std::int32_t sum = std::int32_t{a} + b;\n"
         "    return wrap16(sum < -32768 ? -32768 : sum > 32752 ? 32752 : sum);"),
        ("return wrap16(std::int32_t{a} - b);",
         "const std::int32_t sum = std::int32_t{a} - b;\n"
         "    return wrap16(sum < -32768 ? -32768 : sum > 32752 ? 32752 : sum);")]),
    "ratio_sign": (ENGINE, "rules/Trellis.h", [("subWrap(bestPath<1>(rule, a, b, g), bestPath<0>(rule, a, b, g))",
                                          "subWrap(bestPath<0>(rule, a, b, g), bestPath<1>(rule, a, b, g))")]),
    "ratio_rounding": (ENGINE, "rules/Trellis.h", [
        ("return subWrap(bestPath<1>(rule, a, b, g), bestPath<0>(rule, a, b, g));",
         "return static_cast<Value>(subWrap(bestPath<1>(rule, a, b, g), bestPath<0>(rule, a, b, g)) + "
         "16 * (a[0] & 16 ? 1 : 0));")]),
    "ratio_unwrapped": (ENGINE, "rules/Trellis.h", [
        ("return subWrap(bestPath<1>(rule, a, b, g), bestPath<0>(rule, a, b, g));",
         "const int ratio = bestPath<1>(rule, a, b, g) - bestPath<0>(rule, a, b, g);\n"
         "    return static_cast<Value>(ratio < -32768 ? -32768 : ratio > 32752 ? 32752 : ratio);")]),
    "tail_sign": (SEGMENTS, "rules/Trellis.h", [("{-e2 - e1 - g0,", "{-e2 - e1 + g0,")]),
    "tail_bits_kept": (SEGMENTS, SEGMENTS, [("    *column = border(*column);\n", "")]),
    "forward_bits_kept": (SEGMENTS, SEGMENTS, [("starts[u] = border(reached);", "starts[u] = reached;")]),
    "forward_border_unknown": (SEGMENTS, SEGMENTS, [("starts[u] = border(reached);",
                                                     "starts[u] = u == 0 ? border(reached) : T8{};")]),
    "backward_bits_kept": (SEGMENTS, SEGMENTS, [("stored = border(reached);", "stored = reached;")]),
    "backward_border_early": (SEGMENTS, SEGMENTS, [("i + 1 < starts.size() ? T8{} : held;",
                                                    "i + 1 < starts.size() ? T8{} : starts[i];")]),
    "first_state_unknown": (SEGMENTS, SEGMENTS, [("setInitialState(starts.data());",
                                                  "preCalcAlpha(h, 0, starts.data());")]),
    "backward_uncorrected": (ENGINE, ENGINE, [("backward(MaxHash(Corrections{itsBetaLUT}), n, g, b)",
                                               "backward(Max{}, n, g, b)")]),
    "forward_corrected_early": (ENGINE, ENGINE, [("forward(MaxHash(Corrections{itsAlphaLUT}), n, g, a)",
                                                  "forward(MaxStar(Corrections{itsAlphaLUT}), n, g, a)")]),
    "forward_state_swapped": (ENGINE, ENGINE, [
        ("        store(rule, metrics, a[j]);", "        std::swap(metrics[2], metrics[3]);\n        store(rule, metrics, a[j]);")]),
    "border_six_bits": (SEGMENTS, SEGMENTS, [("arithmetic::borderMask", "-64")]),
    "border_nine_bits": (SEGMENTS, SEGMENTS, [("arithmetic::borderMask", "-512")]),
    "border_bit_kept": (SEGMENTS, SEGMENTS, [("arithmetic::borderMask", "-97")]),
    "forward_border_stale": (SEGMENTS, SEGMENTS, [("starts[u] = border(reached);",
                                                   "starts[u] = h < 2 ? border(reached) : start;")]),
    "forward_border_late": (SEGMENTS, SEGMENTS, [
        ("starts[u] = border(reached);",
         "static std::vector<T8> held[2];\n"
         "        held[constituent(h)].resize(starts.size());\n"
         "        starts[u] = u == 0 ? start : h < 2 ? T8{} : held[constituent(h)][u];\n"
         "        held[constituent(h)][u] = border(reached);")]),
    "forward_border_early": (SEGMENTS, SEGMENTS, [("const T8 start = starts[u];",
                                                   "const T8 start = u == 0 || h < 2 ? starts[u] : border(reached);")]),
    "forward_border_other_code": (SEGMENTS, SEGMENTS, [("starts[u] = border(reached);",
                                                        "itsAlphaInit[1 - constituent(h)][u] = border(reached);")]),
    "backward_border_stale": (SEGMENTS, SEGMENTS, [("stored = border(reached);",
                                                    "stored = h < 2 ? border(reached) : stored;")]),
    "tail_clipped": (SEGMENTS, "rules/Trellis.h", [
        ("t.x[2] + t.p[2] + t.q[2];", "arithmetic::clip(t.x[2] + t.p[2], -2048, 2032);"),
        ("t.x[1] + t.p[1] + t.q[1];", "arithmetic::clip(t.x[1] + t.p[1], -2048, 2032);"),
        ("t.x[1] - t.p[1] + t.q[1];", "arithmetic::clip(t.x[1] - t.p[1], -2048, 2032);"),
        ("const auto [g0, g1, g2, g3] = branchSums(t.x[0], t.p[0], t.q[0]);",
         "const Wide g0 = arithmetic::clip(t.x[0] + t.p[0], -2048, 2032), g3 = g0;\n"
         "    const Wide g1 = arithmetic::clip(t.x[0] - t.p[0], -2048, 2032), g2 = g1;")]),
    "metrics_stored_in_eleven_bits": (ENGINE, ENGINE, [
        ("column[state] = rule.stored(metrics[state]);", "column[state] = static_cast<short>(wrap16(2 * rule.stored(metrics[state])) / 2);"),
        ("store(rule, metrics, a[j]);", "store(rule, metrics, a[j]);\n        metrics = load(rule, a[j]);"),
        ("store(rule, metrics, *--b);", "store(rule, metrics, *--b);\n        metrics = load(rule, *b);")]),
    "metrics_kept_in_eleven_bits": (ENGINE, ENGINE, [
        ("column[state] = rule.stored(metrics[state]);",
         "column[state] = static_cast<short>(wrap16(2 * rule.stored(metrics[state])) / 2);")]),
    "metrics_eleven_bits": (ENGINE, "rules/Arithmetic.h", [
        ("return wrap16(std::int32_t{a} + b);", "return static_cast<Value>(wrap16(2 * (std::int32_t{a} + b)) / 2);"),
        ("return wrap16(std::int32_t{a} - b);", "return static_cast<Value>(wrap16(2 * (std::int32_t{a} - b)) / 2);")]),
    "parity_negated_in_eight": (ENGINE, ENGINE, [
        ("const auto sums = trellis::branchSums<std::int32_t>(2 * intrinsic[k], parity0[k], parity1[k]);",
         "auto sums = trellis::branchSums<std::int32_t>(2 * intrinsic[k], parity0[k], parity1[k]);\n"
         "        sums[1] -= parity0[k] == -2048 ? 4096 : 0;\n"
         "        sums[2] -= parity0[k] == -2048 ? 4096 : 0;")]),
    "doubled_in_eight": (ENGINE, ENGINE, [
        ("2 * intrinsic[k], parity0[k]",
         "16 * static_cast<signed char>(2 * intrinsic[k] / 16), parity0[k]")]),
    "extrinsic_symmetric": (DECODER, DECODER, [("shiftRight(branch.itsMin, spareBits)",
                                                "-shiftRight(branch.itsMax, spareBits)")]),
    "branch_seven_bits": (ENGINE, ENGINE, [("wrap16(arithmetic::clip(sums[i], lo, hi))",
                                            "wrap16(arithmetic::clip(sums[i], lo / 2, hi / 2 - 8))")]),
    "one_unit_stuck_bit": (DECODER, DECODER, [
        ("maskBits(wrap16(extrinsic), mask)",
         "maskBits(wrap16(j >= 256 && j < 512 ? extrinsic & ~32 : extrinsic), mask)")]),
}


def write_if_new(path, text):
    """Leaves an unchanged file as it is, so that nothing is compiled again."""
    if not path.exists() or path.read_text() != text:
        path.parent.mkdir(parents=True, exist_ok=True)
        path.write_text(text)


def main():
    sources, out = map(pathlib.Path, sys.argv[1:])
    for name, (unit, changed, replacements) in FAULTS.items():
        text = (sources / changed).read_text()
        for before, after in replacements:
            if text.count(before) != 1:
                sys.exit(f"faults.py: {name}: {changed} has {text.count(before)} times {before!r}, expected once")
            text = text.replace(before, after)
        write_if_new(out / name / unit, (sources / unit).read_text())
        write_if_new(out / name / changed, text)
        print(name, unit)


if __name__ == "__main__":
    main()
