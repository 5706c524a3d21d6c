// LiveTable: prints a run's points as a growing table, with a progress line on terminals.
#ifndef MORVIK_APP_BER_LIVETABLE_H
#define MORVIK_APP_BER_LIVETABLE_H

#include <chrono>
#include <cstddef>
#include <optional>
#include <ostream>
#include <string>

#include "simulation/Plan.h"
#include "simulation/Progress.h"

namespace morvik {

/// Prints a heading for each curve and a row for each finished point; given a width, also a progress line that fits it.
/// Throws base::Error if the table cannot be written.
class LiveTable : public simulation::Progress {
public:
    /// Plan and stream must outlive the table.
    LiveTable(const simulation::Plan& plan, std::ostream& stream, std::optional<std::size_t> width);
    ~LiveTable() override;

    void isAt(const simulation::PointResult& running) override;
    void hasEnded(const simulation::PointResult& point) override;

private:
    void writeHeading(const simulation::Point& point);
    void write(const std::string& text);
    void eraseMovingLine();

    const simulation::Plan& itsPlan;
    std::ostream& itsStream;
    std::optional<std::size_t> itsWidth;
    std::optional<simulation::Point> itsHeading;  // a point of the curve under the last heading
    std::chrono::steady_clock::time_point itsLastMove;
    bool itsHasMovingLine = false;
};

}  // namespace morvik

#endif
