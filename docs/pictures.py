#!/usr/bin/env python3
"""Draws the pictures of docs/algorithm.md, docs/arithmetic.md, docs/link.md and CONTRIBUTING.md, SVG files beside this one.

    pictures.py [FOLDER]     FOLDER is where the pictures go, if not beside this file

Interleaver, windows and border metrics are those of the model: build/x86_64/bin/morvik has to be built.
The functions and files on a block's way are looked up in the sources.
"""

import csv
import json
import pathlib
import subprocess
import sys
import tempfile

HERE = pathlib.Path(__file__).resolve().parent
FOLDER = pathlib.Path(sys.argv[1]) if len(sys.argv) > 1 else HERE
MORVIK = HERE.parent / "build/x86_64/bin/morvik"
STYLE = """<style>
text { font: 14px sans-serif; fill: #222 } .small { font-size: 12px } .light { fill: #777 }
.one { stroke: #1f5f99; stroke-width: 2 } .zero { stroke: #b5541c; stroke-width: 2; stroke-dasharray: 7 5 }
.dots { stroke-width: 3.2; stroke-linecap: round; fill: none } .line { stroke: #222; stroke-width: 1.5; fill: none }
.earlier { stroke: #1f5f99; stroke-width: 2; fill: none } .same { stroke: #b5541c; stroke-width: 2; fill: none }
.state { fill: #fff; stroke: #222; stroke-width: 1.5 } .box { stroke: #fff; stroke-width: 1.5 }
@media (prefers-color-scheme: dark) { svg { background: #fff } }
</style>"""


def svg(width, height, elements):
    return (f'<svg xmlns="http://www.w3.org/2000/svg" viewBox="0 0 {width} {height}" '
            f'width="{width}" height="{height}">\n<rect width="100%" height="100%" fill="#fff"/>\n{STYLE}\n'
            + "\n".join(elements) + "\n</svg>\n")


def printed(*arguments):
    return subprocess.run([MORVIK, *arguments], stdout=subprocess.PIPE, text=True, check=True).stdout


def text(x, y, content, anchor="middle", kind=""):
    return f'<text x="{x}" y="{y}" text-anchor="{anchor}" class="{kind}">{content}</text>'


def successor(state, bit):
    """The encoder of 3GPP TS 36.212: the fed-back bit enters on the left."""
    newest = bit ^ (state >> 1 & 1) ^ (state & 1)
    return newest << 2 | state >> 1


def trellis():
    left, right, top, gap = 150, 470, 50, 52
    elements = [text(left, 24, "step k"), text(right, 24, "step k + 1")]
    for state in range(8):
        for bit in (0, 1):
            y1, y2 = top + gap * state, top + gap * successor(state, bit)
            elements.append(f'<line x1="{left}" y1="{y1}" x2="{right}" y2="{y2}" class="{("zero", "one")[bit]}"/>')
    for state in range(8):
        y = top + gap * state
        for x in (left, right):
            elements.append(f'<circle cx="{x}" cy="{y}" r="14" class="state"/>')
            elements.append(text(x, y + 5, state))
        elements.append(text(left - 30, y + 5, f"{state:03b}", "end", "small light"))
    for pair in range(4):
        y = top + gap * (2 * pair + 0.5)
        elements.append(text(left - 85, y + 5, f"g{pair}"))
    bottom = top + 8 * gap
    for x, kind, label in ((left - 20, "one", "bit 1, + g"), (left + 200, "zero", "bit 0, − g")):
        elements.append(f'<line x1="{x}" y1="{bottom}" x2="{x + 60}" y2="{bottom}" class="{kind}"/>')
        elements.append(text(x + 70, bottom + 5, label, "start"))
    return svg(560, bottom + 25, elements)


def windows():
    """K = 1280 with two units: eight segments of 160 steps, three windows each."""
    division = json.loads(printed("info", "1280", "--json"))["divisions"][0]
    segments, lengths = division["segments"], division["window_lengths"]
    order = [(window["segment"], window["row"]) for window in division["windows"]]
    assert (division["num_pu"], segments, len(lengths)) == (2, 8, 3)
    left, top, height, scale = 84, 60, 46, 0.66
    shades = ("#1f5f99", "#5b93c4", "#a9c8e4")
    elements = [text(left, 24, "K = 1280, two processing units with four threads each: 8 segments, 3 rows of windows",
                     "start")]
    width = sum(lengths) * scale
    for segment in range(segments):
        x = left + segment * width
        elements.append(text(x + width / 2, top - 10, f"segment {segment}", kind="small"))
        offset = 0
        for row, length in enumerate(lengths):
            elements.append(f'<rect x="{x + offset * scale:.1f}" y="{top}" width="{length * scale:.1f}" '
                            f'height="{height}" fill="{shades[row]}" class="box"/>')
            number = order.index((segment, row))
            elements.append(f'<text x="{x + (offset + length / 2) * scale:.1f}" y="{top + height / 2 + 5}" '
                            f'text-anchor="middle" style="fill:{"#fff" if row < 2 else "#222"}">{number}</text>')
            offset += length
        arrow = top + height + 16
        elements.append(f'<path d="M{x + 4:.1f} {arrow} H{x + width - 6:.1f} m-6 -4 l6 4 l-6 4" fill="none" '
                        'stroke="#222" stroke-width="1.5"/>')
        offset = 0
        for length in lengths:
            begin, end = x + offset * scale, x + (offset + length) * scale
            elements.append(f'<path d="M{end - 3:.1f} {arrow + 22} H{begin + 3:.1f} m5 -4 l-5 4 l5 4" fill="none" '
                            'stroke="#b5541c" stroke-width="1.5"/>')
            offset += length
    elements.append(text(left - 10, top + height / 2 + 5, "order", "end", "small"))
    elements.append(text(left - 10, top + height + 20, "forward", "end", "small"))
    elements.append(text(left - 10, top + height + 42, "backward", "end", "small"))
    bottom = top + height + 72
    for row, label in enumerate(("row 0", "row 1", "row 2")):
        x = left + 110 * row
        elements.append(f'<rect x="{x}" y="{bottom - 12}" width="16" height="16" fill="{shades[row]}"/>')
        elements.append(text(x + 24, bottom + 1, label, "start", "small"))
    elements.append(text(left + 340, bottom + 1, "The backward recursion takes the windows in the order of their "
                         "numbers.", "start", "small"))
    return svg(int(left + segments * width + 20), bottom + 20, elements)


def arrow(x1, y1, x2, y2, kind="line"):
    """A straight line with a head at its end; horizontal or vertical."""
    if y1 == y2:
        side = 1 if x2 > x1 else -1
        head = f"m{-6 * side} -4 l{6 * side} 4 l{-6 * side} 4"
    else:
        side = 1 if y2 > y1 else -1
        head = f"m-4 {-6 * side} l4 {6 * side} l4 {-6 * side}"
    return f'<path d="M{x1:.1f} {y1:.1f} L{x2:.1f} {y2:.1f} {head}" class="{kind}"/>'


def box(x, y, width, height, *lines):
    top = y + height / 2 + 5 - 8 * (len(lines) - 1)
    return [f'<rect x="{x}" y="{y}" width="{width}" height="{height}" rx="4" class="state"/>',
            *(text(x + width / 2, top + 16 * i, line, kind="small" if i else "") for i, line in enumerate(lines))]


def turbo():
    """The code, and the decoder's two passes that hand extrinsic values to each other."""
    elements = [text(20, 28, "Encoder", "start"), text(20, 206, "Decoder", "start")]
    elements += [text(30, 62, "bits", "start", "small"), arrow(60, 58, 420, 58), text(430, 62, "systematic", "start")]
    elements += ['<path d="M100 58 V152" class="line"/>', arrow(100, 102, 250, 102), arrow(380, 102, 420, 102)]
    elements += box(250, 84, 130, 36, "first encoder") + [text(430, 107, "first parity", "start")]
    elements += [arrow(100, 152, 150, 152), arrow(215, 152, 250, 152), arrow(380, 152, 420, 152)]
    elements += box(150, 134, 65, 36, "Π") + box(250, 134, 130, 36, "second encoder")
    elements += [text(430, 157, "second parity", "start")]

    elements += box(60, 250, 180, 62, "second code", "even half-iterations", "interleaved order")
    elements += box(400, 250, 180, 62, "first code", "odd half-iterations", "natural order")
    elements += box(290, 232, 60, 30, "Π⁻¹") + box(290, 300, 60, 30, "Π")
    elements += [arrow(240, 256, 290, 256), arrow(350, 256, 400, 256), arrow(400, 306, 350, 306), arrow(290, 306, 240, 306)]
    elements += [text(320, 224, "extrinsic values", kind="small"), text(320, 348, "extrinsic values", kind="small")]
    elements += [arrow(150, 366, 150, 312), text(150, 384, "systematic (Π), second parity", kind="small")]
    elements += [arrow(490, 366, 490, 312), text(490, 384, "systematic, first parity", kind="small")]
    elements += [arrow(580, 281, 620, 281), text(628, 285, "ratios, decisions", "start", "small")]
    return svg(750, 400, elements)


def table(*arguments):
    """What a subcommand prints as CSV: a list of rows, which map columns to integers."""
    rows = csv.DictReader(printed(*arguments).splitlines())
    return [{name: int(value) for name, value in row.items()} for row in rows]


def interleaver():
    """K = 512, eight segments: every position, and the eight that are computed at the same time."""
    size, segments, step = 512, 8, 21
    length = size // segments
    pi = [row["pi"] for row in table("info", str(size), "--table")]
    left, top, scale = 90, 60, 0.8
    side = size * scale

    def at(i):
        return left + i * scale, top + pi[i] * scale

    elements = [text(left, 24, f"Bit i of the second encoder is bit Π(i): K = {size}, {segments} segments", "start"),
                f'<rect x="{left}" y="{top}" width="{side}" height="{side}" class="state"/>']
    for border in range(1, segments):
        offset = border * length * scale
        elements.append(f'<path d="M{left + offset} {top} v{side} M{left} {top + offset} h{side}" stroke="#ccc"/>')
    for segment in range(segments):
        middle = (segment + 0.5) * length * scale
        elements.append(text(left + middle, top - 8, segment, kind="small light"))
        elements.append(text(left - 8, top + middle + 5, segment, "end", "small light"))
    dots = "".join(f"M{x:.1f} {y:.1f}h0" for x, y in map(at, range(size)))
    elements.append(f'<path d="{dots}" class="dots" stroke="#5b93c4"/>')
    together = range(step, size, length)
    assert sorted(pi[i] // length for i in together) == list(range(segments))  # no two from one segment
    assert len({pi[i] % length for i in together}) == 1  # all at the same step of theirs
    for x, y in map(at, together):
        elements.append(f'<circle cx="{x:.1f}" cy="{y:.1f}" r="5" fill="#b5541c"/>')
    origin = pi[step] % length
    elements += [text(left + side / 2, top + side + 24, "i, the order of the second code, by segments"),
                 f'<text transform="translate(28 {top + side / 2}) rotate(-90)" text-anchor="middle">Π(i), by segments</text>']
    note = left + side + 24
    for line, words in enumerate((f"Step {step} of all segments,", "computed at the same time:",
                                  f"step {origin} of all segments", "of the natural order,", "one from each.")):
        elements.append(text(note, top + 24 + 20 * line, words, "start"))
    return svg(int(note + 210), int(top + side + 40), elements)


class Block:
    """The metrics of a noisy block as the model traces them, and what one more step makes of them."""

    def __init__(self, size, passes):
        with tempfile.TemporaryDirectory() as folder:
            name = pathlib.Path(folder) / "block"
            subprocess.run([MORVIK, "ber", "--block-size", str(size), "--ebn0", "0.4", "--num-pu", "2", "--replay", "0:0",
                            "--output", f"{name}.csv"], stdout=subprocess.DEVNULL, check=True)
            traced = table("trace", f"{name}.point0.frame0.csv", "--half-iterations", f"0:{passes - 1}", "--format", "csv")
        self.size = size
        self.passes = [[row for row in traced if row["half_iteration"] == h] for h in range(passes)]

    def column(self, h, step, kind):
        return [self.passes[h][step][f"{kind}{state}"] for state in range(8)]

    def forward(self, h, step):
        """The forward metrics after a step."""
        metrics, found = self.column(h, step, "alpha"), {}
        for state in range(8):
            for bit in (0, 1):
                found[successor(state, bit), bit] = self.branch(h, step, state, bit, metrics[state])
        return [greater(found[state, 1], found[state, 0]) for state in range(8)]

    def backward(self, h, step):
        """The backward metrics before a step."""
        metrics = self.column(h, step, "beta")
        return [greater(*(self.branch(h, step, state, bit, metrics[successor(state, bit)]) for bit in (1, 0)))
                for state in range(8)]

    def branch(self, h, step, state, bit, metric):
        weight = self.passes[h][step][f"g{state // 2}"]
        return wrapped(metric + weight if bit else metric - weight)

    def starts(self, name):
        """Where segments or windows begin, but for the first."""
        rows = self.passes[0][:self.size]
        names = ("segment", "window")[:1 if name == "segment" else 2]
        return [k for k in range(1, self.size) if any(rows[k][each] != rows[k - 1][each] for each in names)]

    def origin(self, h, start, candidates):
        """The one pass in which the column was computed that a recursion starts from, of some candidates by pass."""
        passes = [q for q, column in candidates.items() if [wrapped(m & ~7) for m in column] == start]
        assert len(passes) == 1, (h, passes)
        return passes[0]


def wrapped(metric):
    return (metric + 2048) % 4096 - 2048


def greater(one, zero):
    return zero if wrapped(one - zero) < 0 else one


def borders():
    """What the recursions of half-iteration 2 start from, as the values show: K = 1280, two units, three rows."""
    block, now = Block(1280, 3), 2
    shown, left, top, height, scale = 3, 130, 84, 30, 1.25
    segment_starts, window_starts = block.starts("segment"), block.starts("window")
    length = segment_starts[0]
    width = shown * length * scale
    right = left + width

    def strip(y, label, windows):
        parts = [f'<rect x="{left}" y="{y}" width="{width}" height="{height}" fill="#dce8f2"/>',
                 text(left - 10, y + height / 2 + 5, label, "end", "small")]
        for k in windows:
            parts.append(f'<path d="M{left + k * scale} {y} v{height}" stroke="#fff" stroke-width="2"/>')
        for k in [0, *segment_starts[:shown - 1]]:
            parts.append(f'<path d="M{left + k * scale} {y - 4} v{height + 8}" stroke="#222" stroke-width="1.5"/>')
        return parts

    def border(k, y, origin, side):
        """From the end of one recursion to the start of another, to the right (1) or left (-1) of step k."""
        x = left + k * scale
        if origin == now:
            low = y + 74 + height + 6
            return [f'<path d="M{x - 14 * side:.1f} {low} v8 h{28 * side} v-8 m-4 6 l4 -6 l4 6" class="same"/>']
        return [f'<path d="M{x - 7 * side:.1f} {y + height} v18 L{x + 7 * side:.1f} {y + 62} v10 m-4 -6 l4 6 l4 -6" '
                'class="earlier"/>']

    elements = [text(20, 24, "K = 1280, two processing units: the first 3 of 8 segments, each with 3 windows (rows 0, 1 and 2)",
                     "start")]
    for y, title in ((top, "Forward: where segments begin"), (top + 190, "Backward: where windows end")):
        elements.append(text(20, y - 22, title, "start"))
        within = [k for k in window_starts if k < shown * length]
        forward = y == top
        elements += strip(y, "half-iteration 0", () if forward else within)
        elements += strip(y + 74, "half-iteration 2", () if forward else within)
        for k in (segment_starts[:shown - 1] if forward else [*within, segment_starts[shown - 1]]):
            if forward:
                origin = block.origin(now, block.column(now, k, "alpha"), {q: block.forward(q, k - 1) for q in (0, 1, 2)})
            else:
                origin = block.origin(now, block.column(now, k - 1, "beta"), {q: block.backward(q, k) for q in (0, 1, 2)})
            elements += border(k, y, origin, 1 if forward else -1)
        if forward:
            elements += [arrow(left - 26, y + 126, left + 6, y + 126), text(left - 32, y + 131, "known state", "end", "small")]
    last = top + 190
    elements.append(text(right + 14, last + 74 + height / 2 + 5, "... the last window: the tail's column", "start", "small"))

    key = last + 150
    elements += [f'<path d="M{left} {key} h40" class="earlier"/>',
                 text(left + 50, key + 5, "from the last pass over the same code (the first one starts from zeros)", "start", "small"),
                 f'<path d="M{left} {key + 22} h40" class="same"/>',
                 text(left + 50, key + 27, "from this pass: row 0 is computed before row 2", "start", "small")]
    k = segment_starts[0]
    for line, (label, column) in enumerate(((f"computed after step {k - 1}, half-iteration 0", block.forward(0, k - 1)),
                                            (f"the start of segment 1, half-iteration {now}", block.column(now, k, "alpha")))):
        y = key + 62 + 20 * line
        elements.append(text(left + 270, y, label, "end", "small"))
        elements += [text(left + 330 + 44 * state, y, metric, "end", "small") for state, metric in enumerate(column)]
    elements.append(text(left + 270, key + 104, "the low three of the traced bits are cleared (rule 11)", "end", "small light"))
    return svg(int(right + 250), key + 124, elements)


class Way:
    """A column of stations: what happens, and the function that does it. The sources have it."""

    def __init__(self, left, width):
        self.left, self.middle, self.width = left, left + width / 2, width
        self.elements = []

    def station(self, y, what, *names):
        for name in names:
            file, _, functions = name.partition(": ")
            source = (HERE.parent / file).read_text()
            for function in functions.split(", "):
                assert function in source, name
        self.elements += box(self.left, y, self.width, 26 + 18 * len(names), what, *names)
        return y + 26 + 18 * len(names)

    def stations(self, y, *stations):
        """One below the other; returns where each ends."""
        ends = []
        for number, station in enumerate(stations):
            if number > 0:
                self.elements.append(arrow(self.middle, y - 20, self.middle, y))
            y = self.station(y, *station) + 20
            ends.append(y - 20)
        return ends

    def again(self, top, bottom, label):
        """Back from the end of a station to the beginning of an earlier one, on the right."""
        x = self.left + self.width
        self.elements += [f'<path d="M{x} {bottom} h18 V{top} h-18 m6 -4 l-6 4 l6 4" class="line"/>',
                          text(x + 24, (top + bottom) / 2 + 5, label, "start", "small")]


def flow():
    """How a block travels: the way by the lanes, and that by the components."""
    lanes, components, both = Way(20, 420), Way(560, 420), Way(290, 420)
    end = both.stations(16, ("A call: one block is a batch of one", "src/morvik_v1_0_bitacc_cmodel.cpp: bitacc_simulate",
                             "src/morvik_v1_0_batch.cpp: batch_simulate, batch_count_errors"),
                        ("Arguments and room are checked", "src/SimulationCall.cpp: checkArguments, shortArray"),
                        ("Do the lanes take it?", "src/SimulationCall.cpp: send", "src/PathChoice.cpp: lanesFor"))[-1]
    top = end + 56
    for way, label, side in ((lanes, "yes", -1), (components, "no: traced, preset, told so, or a wrong size", 1)):
        both.elements += [f'<path d="M{both.middle + side * 60} {end} v22 H{way.middle}" class="line"/>',
                          arrow(way.middle, end + 22, way.middle, top),
                          text(way.middle + side * 8, end + 40, label, "end" if side < 0 else "start", "small")]

    left = lanes.stations(top, ("Blocks are cut, loaded and clipped", "src/LanePath.cpp: take, prepare, load",
                                "rules/Cut.h: segmentCount, windowStart"),
                          ("A slice for each step, a lane for each segment", "lanes/LaneDecoder.cpp: load, prepareWork", "lanes/SizeTables.cpp: write",
                           "lanes/Transpose.h: fillSlices"),
                          ("The kernel of an instruction set", "lanes/LaneDecoder.cpp: decode, prepareStarts",
                           "lanes/Kernels.cpp: decode, forHalfIterations"),
                          ("A pass, window by window", "lanes/Pass.h: runPass, forwardStep, backwardStep", "lanes/StatePass.h: run",
                           "lanes/Rules.h: Greatest, Corrected", "lanes/Machine.h: Permutation"),
                          ("Decisions", "src/LanePath.cpp: decisions, ratios", "lanes/LaneDecoder.cpp: spread"))
    lanes.again(left[2] + 32, left[3] - 12, "2 x iterations")

    right = components.stations(top, ("Values are clipped and joined", "src/ComponentPath.cpp: take",
                                      "src/CoreInputs.h: forEachSoftValue"),
                                ("Streams and tail, segments and windows", "src/TDecoder3G.cpp: decode, extract",
                                 "src/TDecoder3GPU.cpp: allocate, buildSegments", "rules/Cut.h: segmentCount, windowStart"),
                                ("A half-iteration", "src/TDecoder3G.cpp: calcSISO, calcIntrinsic, calcLLR, calcExtrinsic",
                                 "src/TDecoder3GPU.cpp: calcGamma, calcAlpha, calcBeta",
                                 "src/TCalculationEngineModBase.cpp: gamma, alpha, beta, llr"),
                                ("Decisions", "src/TDecoder3G.cpp: hardDecisions", "src/ComponentPath.cpp: decisions, ratios"))
    components.again(right[1] + 32, right[2] - 12, "2 x iterations")

    top = max(left[-1], right[-1]) + 30
    for way, end, side in ((lanes, left[-1], both.left), (components, right[-1], both.left + both.width)):
        both.elements += [f'<path d="M{way.middle} {end} V{top + 22}" class="line"/>',
                          arrow(way.middle, top + 22, side, top + 22)]
    bottom = both.station(top, "Decisions, ratios and tags are delivered", "src/SimulationCall.cpp: deliver")
    bottom = both.station(bottom + 30, "The arithmetic of both, written once",
                          "rules/Trellis.h: branchSums, forwardStep, backwardStep, tailColumn",
                          "rules/Arithmetic.h: addWrap, subWrap, maxWrap, clip")
    return svg(1100, bottom + 20, both.elements + lanes.elements + components.elements)


def link():
    """The LTE chain: the transmitter goes down, the receiver up; what undoes a step stands beside it."""
    sent, received = Way(20, 400), Way(560, 400)
    pairs = (
        (("Transport block of A bits, and its CRC (5.1.1)", "link/coding/Crc.h: crc24a"),
         ("CRC of the transport block", "link/coding/TransportBlock.h: fits")),
        (("C code blocks, F filler bits, CRCs (5.1.2)", "link/coding/CodeBlocks.h: codeBlocksOf"),
         ("Decisions joined, CRC of each code block", "link/coding/TransportBlock.h: join")),
        (("Turbo code: three streams of K + 4 bits (5.1.3)", "link/coding/TurboEncoder.h: encode"),
         ("The core", "include/morvik_v1_0_batch.h: batch_simulate_i8")),
        (("Sub-block interleavers, circular buffer (5.1.4.1.1)", "link/coding/RateMatching.h: positions"),
         ("Three streams: filler bits -128, not received 0", "link/coding/RateMatching.h: deinterleave")),
        (("E bits from k0 on, N_cb positions (5.1.4.1.2)", "link/coding/RateMatching.h: select"),
         ("Soft buffer: transmissions are added", "link/coding/RateMatching.h: recover")),
        (("G bits, code block after code block (5.1.5)", "link/coding/TransportBlock.h: select"),
         ("Ratios of each code block", "link/coding/TransportBlock.h: recover")),
        (("Symbols of Q_m bits (36.211, 7.1)", "link/modulation/Mapper.h: mapSymbols"),
         ("Log-likelihood ratios of bits", "link/modulation/Demapper.h: demapSymbols")))
    y = 44
    ways = [text(sent.middle, 26, "Transmitter"), text(received.middle, 26, "Receiver")]
    for row, (down, up) in enumerate(pairs):
        sent.station(y, *down)
        bottom = received.station(y, *up)
        if row > 0:
            ways += [arrow(sent.middle, y - 20, sent.middle, y), arrow(received.middle, y, received.middle, y - 20)]
        if row in (3, 4):
            ways.append(text(received.middle + 10, y - 6, ("soft values", "ratios x scale, rounded, clipped")[row - 3],
                             "start", "small"))
        y = bottom + 20
    middle = bottom - 22
    ways += [arrow(sent.left + sent.width, middle, received.left, middle), text(490, middle - 8, "noise, fading", kind="small")]
    return svg(980, bottom + 20, ways + sent.elements + received.elements)


if __name__ == "__main__":
    for picture in (trellis, windows, turbo, interleaver, borders, flow, link):
        (FOLDER / f"{picture.__name__}.svg").write_text(picture())
