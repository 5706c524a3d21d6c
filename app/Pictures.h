// Pictures: what `morvik ber` draws of its results.
#ifndef MORVIK_PICTURES_H
#define MORVIK_PICTURES_H

#include <string>
#include <vector>

#include "report/Curves.h"
#include "simulation/Plan.h"

namespace morvik {

/// The files that are asked for; empty ones are not.
struct PictureOptions {
    std::string plot;
    std::string report;
    std::vector<std::string> references;  // files with curves to compare with
};

/// The pictures of one run.
class Pictures {
public:
    /// Reads the references and finds out whether the files can be written, before a long run. Throws
    /// std::runtime_error.
    explicit Pictures(const PictureOptions& options);

    /// Draws what has been counted. Throws std::runtime_error.
    void draw(const simulation::Plan& plan, const std::vector<simulation::PointResult>& points) const;

private:
    PictureOptions itsOptions;
    std::vector<report::Curve> itsReferences;
};

}  // namespace morvik

#endif
