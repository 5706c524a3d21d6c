// Plot: curves and shapes drawn to a file by gnuplot.
#ifndef MORVIK_REPORT_PLOT_H
#define MORVIK_REPORT_PLOT_H

#include <string>
#include <vector>

#include "Curves.h"
#include "Drawing.h"

namespace morvik::report {

/// Throws base::Error with the reason unless writePlot can be expected to work: the file's suffix is .svg, .png
/// or .pdf, its folder is writable, and the installed gnuplot supports the format.
void checkPlot(const std::string& fileName);

/// Draws BER and BLER against Eb/N0 in the format of the file's suffix, .svg, .png or .pdf. The file appears complete
/// or not at all. Throws base::Error.
void writePlot(const std::string& fileName, const std::vector<Curve>& curves, const std::string& title);

/// The same for a drawing.
void writeDrawing(const std::string& fileName, const Drawing& drawing);

}  // namespace morvik::report

#endif
