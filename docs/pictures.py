#!/usr/bin/env python3
"""Draws the pictures of docs/arithmetic.md: trellis.svg and windows.svg, beside this file."""

import pathlib

FOLDER = pathlib.Path(__file__).parent
STYLE = """<style>
text { font: 14px sans-serif; fill: #222 } .small { font-size: 12px } .light { fill: #777 }
.one { stroke: #1f5f99; stroke-width: 2 } .zero { stroke: #b5541c; stroke-width: 2; stroke-dasharray: 7 5 }
.state { fill: #fff; stroke: #222; stroke-width: 1.5 } .box { stroke: #fff; stroke-width: 1.5 }
@media (prefers-color-scheme: dark) { svg { background: #fff } }
</style>"""


def svg(width, height, elements):
    return (f'<svg xmlns="http://www.w3.org/2000/svg" viewBox="0 0 {width} {height}" '
            f'width="{width}" height="{height}">\n<rect width="100%" height="100%" fill="#fff"/>\n{STYLE}\n'
            + "\n".join(elements) + "\n</svg>\n")


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
    segments, lengths = 8, (64, 48, 48)
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
            number = row * segments + segment
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


(FOLDER / "trellis.svg").write_text(trellis())
(FOLDER / "windows.svg").write_text(windows())
