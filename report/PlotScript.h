// PlotScript: the gnuplot script of a plot.
#ifndef MORVIK_REPORT_PLOTSCRIPT_H
#define MORVIK_REPORT_PLOTSCRIPT_H

#include <string>
#include <vector>

#include "Curves.h"

namespace morvik::report {

/// The command that selects a format and its size. The size is omitted when only asking whether gnuplot has the format.
/// The suffix is .svg, .png or .pdf.
std::string terminalCommand(const std::string& suffix);

/// The commands that open a picture of the given height, in points; all pictures have the same width.
std::string openingCommands(const std::string& suffix, int height);
constexpr int pictureWidth = 1000;

/// gnuplot's size for a font of the given size in points.
double fontSize(const std::string& suffix, double points);

/// A literal string for gnuplot: only the plainest characters are written as themselves. Digits are escaped, as gnuplot
/// would take those after an octal escape as part of it.
std::string quoted(const std::string& text);

/// The whole script, including data. The picture goes to gnuplot's standard output, so the script contains no file
/// name; titles are strings that gnuplot does not interpret.
std::string plotScript(const std::string& suffix, const std::vector<Curve>& curves, const std::string& title);

}  // namespace morvik::report

#endif
