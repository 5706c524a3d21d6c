// MorvikUnits: the units of the core as functions, for test benches of single units in SystemC. docs/units.md explains
// them.
#ifndef MORVIK_BINDINGS_SYSTEMC_MORVIKUNITS_H
#define MORVIK_BINDINGS_SYSTEMC_MORVIKUNITS_H

#include <array>
#include <cstddef>
#include <cstdint>
#include <string>
#include <systemc>

#include "morvik_units.h"

/// What each unit computes, in integers of eighths, as morvik_units.h describes it. A refused input becomes an error
/// report of type "morvik". It throws, unless sc_report_handler is told otherwise; results are then zeros.
class MorvikUnits {
public:
    using Metrics = std::array<std::int32_t, 8>;
    using Branches = std::array<std::int32_t, 4>;
    using TailValues = std::array<std::int32_t, 3>;

    /// A column of a recursion, with the correction pending with each metric: zeros, but for algorithm 2.
    struct Column {
        Metrics metrics{};
        Metrics pending{};
    };

    /// algorithm    0 max-log, 1 scaled, 2 table
    explicit MorvikUnits(int algorithm) : itsAlgorithm(algorithm) {}

    /// Twice the intrinsic value.
    std::int32_t intrinsic(std::int32_t apriori, std::int32_t systematic) const
    {
        std::int32_t twice = 0;
        expectTaken("intrinsic", morvik_unit_intrinsic(apriori, systematic, &twice));
        return twice;
    }

    Branches branch(std::int32_t twiceIntrinsic, std::int32_t parity) const
    {
        Branches g{};
        expectTaken("branch", morvik_unit_branch(twiceIntrinsic, parity, g.data()));
        return g;
    }

    /// The column behind a step.
    Column forward(const Column& alpha, const Branches& g) const
    {
        return step("forward", morvik_unit_forward, alpha, g);
    }

    /// The column before a step.
    Column backward(const Column& beta, const Branches& g) const
    {
        return step("backward", morvik_unit_backward, beta, g);
    }

    std::int32_t ratio(const Metrics& alpha, const Metrics& beta, const Branches& g) const
    {
        std::int32_t llr = 0;
        expectTaken("ratio", morvik_unit_ratio(itsAlgorithm, alpha.data(), beta.data(), g.data(), &llr));
        return llr;
    }

    std::int32_t extrinsic(std::int32_t ratio, std::int32_t twiceIntrinsic) const
    {
        std::int32_t value = 0;
        expectTaken("extrinsic", morvik_unit_extrinsic(itsAlgorithm, ratio, twiceIntrinsic, &value));
        return value;
    }

    /// The interleaver's address of a step of the interleaved code.
    std::int32_t address(std::int32_t blockSize, std::int32_t step) const
    {
        std::int32_t position = 0;
        expectTaken("address", morvik_unit_address(blockSize, step, &position));
        return position;
    }

    /// The backward metrics before the tail.
    Metrics tail(const TailValues& systematic, const TailValues& parity) const
    {
        Metrics beta{};
        expectTaken("tail", morvik_unit_tail(systematic.data(), parity.data(), beta.data()));
        return beta;
    }

    /// A column as a border keeps it.
    Metrics border(const Metrics& column) const
    {
        Metrics kept{};
        expectTaken("border", morvik_unit_border(column.data(), kept.data()));
        return kept;
    }

    /// The values of a row from signed registers side by side, the first in the lowest bits. A value with bits that are
    /// x or z is refused by every unit.
    template <std::size_t count>
    static std::array<std::int32_t, count> rowOf(const sc_dt::sc_lv_base& bits)
    {
        const int width = bits.length() / static_cast<int>(count);
        std::array<std::int32_t, count> row{};
        for (int i = 0; i < static_cast<int>(count); ++i) {
            const sc_dt::sc_lv_base value = bits.range((i + 1) * width - 1, i * width);
            row[static_cast<std::size_t>(i)] = value.is_01() ? value.to_int() : INT32_MIN;
        }
        return row;
    }

private:
    template <class Unit>
    Column step(const char* name, Unit unit, const Column& from, const Branches& g) const
    {
        Column to;
        expectTaken(name,
                    unit(itsAlgorithm,
                         from.metrics.data(),
                         from.pending.data(),
                         g.data(),
                         to.metrics.data(),
                         to.pending.data()));
        return to;
    }

    static void expectTaken(const char* unit, std::int32_t status)
    {
        if (status != MORVIK_UNIT_OK) {
            SC_REPORT_ERROR("morvik",
                            ("ERROR:unit:" + std::string(unit) + ": " + morvik_unit_status_text(status)).c_str());
        }
    }

    int itsAlgorithm;
};

#endif
