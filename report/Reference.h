// Reference: reference curves, from CSV files and results.
#ifndef MORVIK_REPORT_REFERENCE_H
#define MORVIK_REPORT_REFERENCE_H

#include <string>
#include <vector>

#include "Curves.h"
#include "simulation/Point.h"

namespace morvik::report {

/// Reads published error rates or results of `morvik ber`, both CSV with comment lines that begin with #; results as
/// JSON, too, if the name ends in .json.
///
/// The first line that is not a comment names the columns, in any order: ebn0_db or esn0_db, and at least one of ber,
/// bler and fer (another name of bler). Optional columns: blocks or else frames, bit_errors, block_errors or
/// frame_errors, ber_low, ber_high, bler_low, bler_high and clipped_fraction. block_size, num_pu, algorithm, iterations
/// and scale_option separate the rows into curves (see curvesOf); other columns are ignored. A comment "# title: TEXT"
/// names the curve, otherwise the file name does.
///
/// The curves are for pictures over one axis. A place on the other one is converted, where the row tells how many bits
/// a symbol has: by block_size for BPSK, or modulation with block_size, or with transport_block_size and coded_bits.
///
/// Throws base::Error with one line that begins with the place, FILE or FILE:LINE.
std::vector<Curve> readReference(const std::string& fileName, simulation::Axis axis = simulation::Axis::ebn0);

}  // namespace morvik::report

#endif
