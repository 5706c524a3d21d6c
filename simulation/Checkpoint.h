// Checkpoint: how far a run has come, as text to go on from.
#ifndef MORVIK_SIMULATION_CHECKPOINT_H
#define MORVIK_SIMULATION_CHECKPOINT_H

#include <optional>
#include <string>
#include <vector>

#include "Plan.h"

namespace morvik::simulation {

struct Checkpoint {
    std::string version;  // of the plan, as is the command
    std::string command;
    std::vector<PointResult> ended;
    std::optional<PointResult> running;
    std::vector<PointResult> begun;  // later points, which an earlier run with smaller limits has counted
};

/// The line with the checksum that a checkpoint opens with, before the rest of it.
std::string checkpointOpening(const std::string& body);

/// The text, which opens with a checksum.
std::string checkpointText(const Checkpoint& checkpoint);

/// What checkpointText() has written; nothing if the text was damaged. Throws Error that opens with the file's name
/// when the checksum is right, but the rest is no checkpoint.
std::optional<Checkpoint> parseCheckpoint(const std::string& text, const std::string& fileName);

}  // namespace morvik::simulation

#endif
