// Units: the operations of the core as pure functions, one for each unit of the hardware.
//
// All values are integers in eighths, as the core's registers hold them, and within the ranges that Ports.h names.
#ifndef MORVIK_HARDWARE_UNITS_UNITS_H
#define MORVIK_HARDWARE_UNITS_UNITS_H

#include <array>
#include <cstdint>

#include "rules/Tail.h"
#include "rules/Trellis.h"

namespace morvik::units {

/// Algorithm type 2, whose decisions are corrected.
constexpr int tableAlgorithm = 2;

using Metrics = std::array<std::int32_t, rules::stateCount>;
using Branches = std::array<std::int32_t, rules::stateCount / 2>;
using TailValues = std::array<std::int32_t, rules::tailSteps>;

/// A column inside a recursion: the metrics, and the correction pending with each of them (rule 7), 0 unless the
/// algorithm has a table.
struct Column {
    Metrics metrics{};
    Metrics pending{};
};

/// Twice the intrinsic value (rule 13). The signal `intrinsic` is its half, rounded down.
std::int32_t twiceIntrinsic(std::int32_t apriori, std::int32_t systematic);

/// The four branch metrics (rule 5).
Branches branchMetrics(std::int32_t twiceIntrinsic, std::int32_t parity);

/// The column behind a step of the forward recursion (rules 6 and 7).
Column forward(int algorithm, const Column& before, const Branches& g);

/// The column before a step of the backward recursion (rules 6 and 7).
Column backward(int algorithm, const Column& behind, const Branches& g);

/// The log-likelihood ratio of a step from the forward metrics before it and the backward ones behind it (rule 8).
std::int32_t ratio(int algorithm, const Metrics& alpha, const Metrics& beta, const Branches& g);

/// The extrinsic value (rule 14).
std::int32_t extrinsic(int algorithm, std::int32_t ratio, std::int32_t twiceIntrinsic);

/// The interleaver's address of a step, in a block of K bits, a block size (rule 15).
std::uint32_t address(std::uint32_t K, std::uint32_t step);

/// The backward metrics at step K (rule 12).
Metrics tail(const TailValues& systematic, const TailValues& parity);

/// A column as a border keeps it (rule 11).
Metrics border(const Metrics& column);

}  // namespace morvik::units

#endif
