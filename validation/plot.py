"""The plot of distances, drawn by gnuplot: one column for each comparison and type, a bar for each number of units."""

import subprocess

from distances import CONFIDENCE

COLOURS = {"2": "#1f5f99", "4": "#b5541c", "8": "#3a8a3a"}


def data_blocks(columns, rate):
    """For each number of units: position, distance, and half of the 95 % interval."""
    blocks = []
    for shift, units in zip((-0.22, 0, 0.22), COLOURS):
        lines = [f"{place + shift} {found[rate, units].db} {CONFIDENCE * found[rate, units].deviation}"
                 for place, (*_, found) in enumerate(columns)]
        blocks.append("\n".join(lines))
    return blocks


def script(columns):
    rates = sorted({rate for *_, found in columns for rate, _ in found}, reverse=True)
    ticks = ", ".join(f'"{algorithm}" {place}' for place, (_, _, algorithm, _) in enumerate(columns))
    groups = []
    for place, (size, kind, *_) in enumerate(columns):
        if not groups or groups[-1][:2] != (size, kind):
            groups.append((size, kind, []))
        groups[-1][2].append(place)
    lines = [
        'set terminal svg size 1000,720 font "sans-serif,13" background "#ffffff"',
        "set multiplot layout 2,1 margins 0.08,0.98,0.06,0.92 spacing 0,0.14",
        f"set xrange [-0.6:{len(columns) - 0.4}]", f"set xtics font ',12' ({ticks}) scale 0 nomirror", "set yrange [-0.12:0.55]",
        "set ytics 0.1", "set grid ytics lc rgb '#dddddd'", "set xzeroaxis lc rgb '#222222'",
        'set ylabel "dB to the right of the reference"', "set key at screen 0.98,0.985 right top horizontal samplen 1"]
    for _, _, places in groups[1:]:
        lines.append(f"set arrow from {places[0] - 0.5}, graph 0 to {places[0] - 0.5}, graph 1 nohead lc rgb '#aaaaaa'")
    for number, (size, kind, places) in enumerate(groups, 1):
        middle = (places[0] + places[-1]) / 2
        lines.append(f'set label {number} "{size}\\nbeside\\n{kind}" at {middle}, graph 0.95 center font ",10"')
    for number, rate in enumerate(rates):
        lines.append(f'set title "At a block error rate of {rate}"')
        lines += ["unset key"] if number > 0 else []
        names = []
        for units, block in zip(COLOURS, data_blocks(columns, rate)):
            names.append((f"$rate{number}_{units}", units))
            lines += [f"{names[-1][0]} << END", block, "END"]
        lines.append("plot " + ", ".join(
            f'{name} using 1:2:3 with yerrorbars pt 7 ps 0.4 lc rgb "{COLOURS[units]}" title "{units} units"'
            for name, units in names))
    return "\n".join([*lines, "unset multiplot", ""])


def draw(columns):
    """The picture, as SVG. A column is its block size and iterations, the reference, the type, and the distances."""
    done = subprocess.run(["gnuplot", "-"], input=script(columns).encode(), capture_output=True, check=True)
    return done.stdout
