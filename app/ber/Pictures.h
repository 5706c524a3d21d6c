// Pictures: draws the results of one run or of several merged ones.
#ifndef MORVIK_APP_BER_PICTURES_H
#define MORVIK_APP_BER_PICTURES_H

#include <CLI/CLI.hpp>
#include <string>
#include <vector>

#include "report/Curves.h"
#include "simulation/Results.h"

namespace morvik {

/// The requested files; empty if not requested.
struct PictureOptions {
    std::string plot;
    std::string report;
    std::vector<std::string> references;  // files of curves for comparison

    /// Whether anything is to be drawn.
    bool isAskedFor() const
    {
        return !plot.empty() || !report.empty();
    }
};

/// Adds --plot, --report and --reference, which set `options`.
void addPictureOptions(CLI::App& command, PictureOptions& options);

/// The axis of pictures: Es/N0 if any of the points is on it.
simulation::Axis axisOf(const std::vector<simulation::Point>& points);

/// Draws results as a plot and a report.
class Pictures {
public:
    /// Checks, before a long run, that the files can be written and differ from each other, from `output`, if there is
    /// one, and from the inputs. Throws base::Error.
    Pictures(const PictureOptions& options, const std::string& output, std::vector<std::string> inputs);

    /// Reads the references, for curves over this axis. Throws base::Error.
    void takeAxis(simulation::Axis axis);

    /// Draws the results, at least one. `points` describes their number. Throws base::Error.
    void draw(const simulation::Results& results, const std::string& points) const;

private:
    PictureOptions itsOptions;
    simulation::Axis itsAxis = simulation::Axis::ebn0;
    std::vector<report::Curve> itsReferences;
};

}  // namespace morvik

#endif
