// LiveTable: a run's points as a table that grows, with a line for the running point on terminals.
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

/// The columns of the terminal that standard output goes to; nothing if it goes elsewhere.
std::optional<std::size_t> terminalWidth();

/// Writes a heading for each curve and a row for each ended point; with a width, also a moving line that fits into it.
/// Throws base::Error when the table cannot be written.
class LiveTable : public simulation::Progress {
public:
    /// Plan and stream outlive the table.
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
    std::optional<simulation::Point> itsHeading;  // a point of the curve that the last heading is for
    std::chrono::steady_clock::time_point itsLastMove;
    bool itsHasMovingLine = false;
};

}  // namespace morvik

#endif
