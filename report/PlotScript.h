// PlotScript: what gnuplot is told.
#ifndef MORVIK_REPORT_PLOTSCRIPT_H
#define MORVIK_REPORT_PLOTSCRIPT_H

#include <string>
#include <vector>

#include "Curves.h"

namespace morvik::report {

/// The command that chooses a format and its size; no size while it is only asked whether gnuplot has the format. The
/// suffix is .svg, .png or .pdf.
std::string terminalCommand(const std::string& suffix);

/// The commands that open a picture of the height, in points, and of the width that all pictures have.
std::string openingCommands(const std::string& suffix, int height);
constexpr int pictureWidth = 1000;

/// The size that gnuplot calls a font of the size in points.
double fontSize(const std::string& suffix, double points);

/// A string that gnuplot takes as it stands: only the plainest characters are written as themselves. Digits are none of
/// them, as gnuplot would take those behind an octal number as more of it.
std::string quoted(const std::string& text);

/// The whole script, data included. The picture goes to gnuplot's standard output, so that no file name comes into it;
/// titles come in as strings that gnuplot does not interpret.
std::string plotScript(const std::string& suffix, const std::vector<Curve>& curves, const std::string& title);

}  // namespace morvik::report

#endif
