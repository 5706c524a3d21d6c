// Checkpoint: how far a run has come, as text to go on from.
#ifndef MORVIK_SIMULATION_CHECKPOINT_H
#define MORVIK_SIMULATION_CHECKPOINT_H

#include <optional>
#include <string>
#include <vector>

#include "Plan.h"

namespace simulation {

struct Checkpoint {
    std::string version;  // of the plan, as is the command
    std::string command;
    std::vector<PointResult> ended;
    std::optional<PointResult> running;
};

/// The text, which opens with a checksum.
std::string checkpointText(const Checkpoint& checkpoint);

/// What checkpointText() has written; nothing if the text was damaged.
std::optional<Checkpoint> parseCheckpoint(const std::string& text);

}  // namespace simulation

#endif
