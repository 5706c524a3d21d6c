// Checkpoint: the progress of a run as text, from which it can resume.
#ifndef MORVIK_SIMULATION_CHECKPOINT_H
#define MORVIK_SIMULATION_CHECKPOINT_H

#include <optional>
#include <string>
#include <vector>

#include "Plan.h"

namespace morvik::simulation {

struct Checkpoint {
    std::string version;  // version and command are the plan's
    std::string command;
    std::vector<PointResult> ended;
    std::optional<PointResult> running;
    std::vector<PointResult> begun;  // later points, counted by an earlier run with smaller limits
};

/// The first line of a checkpoint: the checksum of its body.
std::string checkpointOpening(const std::string& body);

/// Formats a checkpoint, checksum first.
std::string checkpointText(const Checkpoint& checkpoint);

/// Parses the output of checkpointText(). Returns nothing if the text is damaged. Throws Error, prefixed with the
/// file's name, if the checksum is right but the rest is no checkpoint.
std::optional<Checkpoint> parseCheckpoint(const std::string& text, const std::string& fileName);

}  // namespace morvik::simulation

#endif
