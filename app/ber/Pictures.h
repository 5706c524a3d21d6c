// Pictures: what is drawn of results: those of a run, or joined ones.
#ifndef MORVIK_APP_BER_PICTURES_H
#define MORVIK_APP_BER_PICTURES_H

#include <CLI/CLI.hpp>
#include <string>
#include <vector>

#include "report/Curves.h"
#include "simulation/Results.h"

namespace morvik {

/// The files that are asked for; empty ones are not.
struct PictureOptions {
    std::string plot;
    std::string report;
    std::vector<std::string> references;  // files with curves to compare with

    /// Whether anything is to be drawn.
    bool isAskedFor() const
    {
        return !plot.empty() || !report.empty();
    }
};

/// Adds --plot, --report and --reference, which fill in `options`.
void addPictureOptions(CLI::App& command, PictureOptions& options);

/// The pictures of some results.
class Pictures {
public:
    /// Reads the references and finds out whether the files can be written, before a long run, and beside the file of
    /// the results, if there is one; none of them may be one of the inputs. Throws base::Error.
    Pictures(const PictureOptions& options, const std::string& output, std::vector<std::string> inputs);

    /// Draws the results, of which there are some. `points` tells how many they are. Throws base::Error.
    void draw(const simulation::Results& results, const std::string& points) const;

private:
    PictureOptions itsOptions;
    std::vector<report::Curve> itsReferences;
};

}  // namespace morvik

#endif
