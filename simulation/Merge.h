// Merge: joins the results of several runs.
#ifndef MORVIK_SIMULATION_MERGE_H
#define MORVIK_SIMULATION_MERGE_H

#include <string>
#include <vector>

#include "Results.h"

namespace morvik::simulation {

/// The results of a file.
struct Part {
    std::string fileName;
    Results results;
};

/// Joins results of disjoint frames: rows with the same parameters become one, with their counts added. The order of
/// the parts does not matter. Points keep their numbers where these are unambiguous, and get new ones otherwise. Throws
/// Error if parts have frames in common, or differ in what all results of a run share.
Results merge(const std::vector<Part>& parts);

}  // namespace morvik::simulation

#endif
