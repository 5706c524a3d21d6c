"""The plots of the Eb/N0 that decoders need, drawn by gnuplot: a column for each algorithm, a curve for each number of
iterations or block size."""

import subprocess

TYPES = ("max-log", "scaled", "table")
TITLES = {"max-log": "max-log (type 0)", "scaled": "scaled (type 1)", "table": "table (type 2)"}
# Colour and marker of each curve.
LOOKS = (("#1f5f99", 7), ("#b5541c", 5), ("#3a8a3a", 9), ("#7a3a8a", 13))


def curve(points, look, dash, title):
    """A curve in gnuplot's format: the element of `plot`, and its data."""
    colour, marker = look
    data = "".join(f"{x} {y:.4f}\n" for x, y in points) + "e\n"
    name = f'title "{title}"' if title else "notitle"
    return f"'-' with linespoints lw 1.8 ps 0.6 pt {marker} dt {dash} lc rgb '{colour}' {name}", data


def panel(title, settings, curves):
    elements, data = zip(*curves)
    return "\n".join([*settings, f'set title "{title}" offset 0,-0.6', "plot " + ", ".join(elements), "".join(data)])


def picture(height, rows, panels):
    script = "\n".join([
        f'set terminal svg size 1000,{height} font "sans-serif,13" background "#ffffff"',
        f"set multiplot layout {rows},{len(TYPES)} margins 0.07,0.99,{70 / height:.3f},{1 - 40 / height:.3f} "
        f"spacing 0.05,{100 / height:.3f}",
        "set grid lc rgb '#dddddd'", "set key top right samplen 2",
        *panels, "unset multiplot", ""])
    return subprocess.run(["gnuplot", "-"], input=script.encode(), capture_output=True, check=True).stdout


def limits(values, step):
    """The integer multiples of the step that enclose all values."""
    return step * (min(values) // step), step * -(-max(values) // step)


def draw_units(needed):
    """Top: Eb/N0 for 2 units; bottom: additional dB for 4 and 8. `needed` has dB by size, type, iterations, units."""
    sizes = sorted({key[0] for key in needed})
    iterations = sorted({key[2] for key in needed}, reverse=True)
    ticks = ", ".join(f'"{size}" {size}' for size in sizes if size not in (104, 1504, 3072, 4096))
    axis = [f"set xtics ({ticks}) font ',10'", "set logscale x 2", "set xrange [36:6900]", 'set xlabel "K" offset 0,0.5']
    low, high = limits(needed.values(), 0.5)
    panels = []
    for number, algorithm in enumerate(TYPES):
        of = {key: value for key, value in needed.items() if key[1] == algorithm}
        panels.append(panel(
            TITLES[algorithm],
            [*axis, "set ytics 0.5", f"set yrange [{low:g}:{high:g}]",
             'set ylabel "Eb/N0 in dB for BLER 0.01, 2 units"' if number == 0 else "unset ylabel",
             "unset key" if number else "set key"],
            [curve([(size, of[size, algorithm, count, "2"]) for size in sizes], look, 1, f"{count} iterations")
             for look, count in zip(LOOKS, iterations)]))
    highest = limits([needed[key] - needed[*key[:3], "2"] for key in needed], 0.1)[1]
    long = [size for size in sizes if (size, TYPES[0], iterations[0], "4") in needed]
    for number, algorithm in enumerate(TYPES):
        curves = [curve([(size, needed[size, algorithm, count, units] - needed[size, algorithm, count, "2"])
                         for size in long], look, dash, f"{units} units" if count == iterations[0] else "")
                  for units, dash in (("8", 1), ("4", 3)) for look, count in zip(LOOKS, iterations)]
        panels.append(panel(
            f"{algorithm}: 8 units solid, 4 units dotted",
            [*axis, f"set xtics ({', '.join(f'{chr(34)}{size}{chr(34)} {size}' for size in long)}) font ',10'",
             f"set xrange [{long[0] * 0.9:g}:{long[-1] * 1.1:g}]", "set ytics 0.1", f"set yrange [-0.02:{highest:g}]",
             'set ylabel "dB more than with 2 units"' if number == 0 else "unset ylabel", "unset key"], curves))
    return picture(720, 2, panels)


def draw_undivided(costs):
    """The cost of segments and windows over the iterations. `costs` has dB by size, type, iterations."""
    sizes = sorted({key[0] for key in costs})
    iterations = sorted({key[2] for key in costs})
    highest = limits(costs.values(), 0.1)[1]
    return picture(420, 1, [panel(
        TITLES[algorithm],
        ["set xtics (3, 4, 6, 8)", f"set xrange [{iterations[0] - 0.4}:{iterations[-1] + 0.4}]",
         'set xlabel "iterations" offset 0,0.5', "set ytics 0.1", f"set yrange [0:{highest:g}]",
         'set ylabel "dB more than undivided, 2 units"' if number == 0 else "unset ylabel",
         "unset key" if number else "set key"],
        [curve([(count, costs[size, algorithm, count]) for count in iterations], look, 1, f"K = {size}")
         for look, size in zip(LOOKS, sizes)]) for number, algorithm in enumerate(TYPES)])
