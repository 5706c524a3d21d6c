// MorvikChecker: compares the values of a core with the model while a SystemC simulation runs. docs/checker.md explains
// it.
#ifndef MORVIK_BINDINGS_SYSTEMC_MORVIKCHECKER_H
#define MORVIK_BINDINGS_SYSTEMC_MORVIKCHECKER_H

#include <array>
#include <cstddef>
#include <cstdint>
#include <memory>
#include <new>
#include <string>
#include <systemc>
#include <vector>

#include "morvik_checker.h"

/// The first difference of a block, refusals and warnings become reports of type "morvik". An error report throws,
/// unless sc_report_handler is told otherwise. Signals and answers are those of morvik_checker.h.
class MorvikChecker {
public:
    /// numPu        2, 4 or 8
    /// algorithm    0 max-log, 1 scaled, 2 table
    MorvikChecker(int numPu, int algorithm)
        : itsChecker(morvik_checker_create(numPu, algorithm), morvik_checker_destroy)
    {
        if (!itsChecker) {
            throw std::bad_alloc();
        }
        reportMessages();
    }

    /// Begins a block: K + 4 soft values of each stream. What was observed before is forgotten.
    int start(const std::vector<std::int32_t>& sys,
              const std::vector<std::int32_t>& par1,
              const std::vector<std::int32_t>& par2,
              int iterations)
    {
        morvik_checker_forget(itsChecker.get());
        if (sys.size() != par1.size() || sys.size() != par2.size()) {
            SC_REPORT_ERROR("morvik",
                            ("The streams differ in length: sys has " + std::to_string(sys.size()) + " values, par1 " +
                             std::to_string(par1.size()) + ", par2 " + std::to_string(par2.size()))
                                .c_str());
            return MORVIK_CHECKER_REFUSED;
        }
        for (std::size_t i = 0; i < sys.size(); ++i) {
            morvik_checker_put(itsChecker.get(), sys[i], par1[i], par2[i]);
        }
        const int status = morvik_checker_start(itsChecker.get(), iterations);
        reportMessages();
        return status;
    }

    /// Takes a value, in eighths, or MORVIK_CHECKER_UNKNOWN.
    int observe(int signal, int halfIteration, int step, int value)
    {
        return answered(morvik_checker_observe(itsChecker.get(), signal, halfIteration, step, value));
    }

    /// Takes a register's bits in two's complement.
    int observe(int signal, int halfIteration, int step, const sc_dt::sc_lv_base& bits)
    {
        return observe(signal, halfIteration, step, valueOf(bits));
    }

    /// Takes all values of MORVIK_CHECKER_G, MORVIK_CHECKER_ALPHA or MORVIK_CHECKER_BETA: four or eight.
    template <std::size_t count>
    int observeRow(int signal, int halfIteration, int step, const std::array<std::int32_t, count>& values)
    {
        static_assert(count == 4 || count == 8, "A row has four or eight values");
        if ((signal == MORVIK_CHECKER_G) != (count == 4)) {
            SC_REPORT_ERROR("morvik",
                            ("Signal " + std::to_string(signal) + " has no row of " + std::to_string(count) +
                             " values: MORVIK_CHECKER_G has 4, MORVIK_CHECKER_ALPHA and MORVIK_CHECKER_BETA have 8")
                                .c_str());
            return MORVIK_CHECKER_REFUSED;
        }
        return answered(morvik_checker_observe_row(itsChecker.get(), signal, halfIteration, step, values.data()));
    }

    /// Bits in two's complement, as a value to observe.
    static int valueOf(const sc_dt::sc_lv_base& bits)
    {
        return bits.is_01() ? bits.to_int() : MORVIK_CHECKER_UNKNOWN;
    }

    /// What the core computes, or MORVIK_CHECKER_UNKNOWN where it computes nothing.
    int value(int signal, int halfIteration, int step)
    {
        const int result = morvik_checker_value(itsChecker.get(), signal, halfIteration, step);
        reportMessages();
        return result;
    }

    /// The log-likelihood ratio of a bit after the last half-iteration, in eighths.
    int ratio(int bit)
    {
        const int result = morvik_checker_ratio(itsChecker.get(), bit);
        reportMessages();
        return result;
    }

    /// Values of a signal observed so far, and values that the core computes.
    int seen(int signal) const
    {
        return morvik_checker_seen(itsChecker.get(), signal);
    }

    int expected(int signal) const
    {
        return morvik_checker_expected(itsChecker.get(), signal);
    }

    /// Reports how much of the block was observed, and all differences. Returns MORVIK_CHECKER_AGREES,
    /// MORVIK_CHECKER_DIFFERS, or MORVIK_CHECKER_INCOMPLETE after an error if values are missing; with `isPartial`,
    /// they may be.
    int report(bool isPartial = false)
    {
        const int standing = morvik_checker_standing(itsChecker.get());
        const std::string text = morvik_checker_report(itsChecker.get());
        reportMessages();
        if (!text.empty()) {
            SC_REPORT_INFO("morvik", text.c_str());
        }
        if (standing != MORVIK_CHECKER_INCOMPLETE) {
            return standing;
        }
        if (!isPartial) {
            SC_REPORT_ERROR("morvik", "ERROR:checker:Values are missing; set partial if that is intended");
        }
        return isPartial ? MORVIK_CHECKER_AGREES : standing;
    }

    /// Counts from now on how often values that are right meet each situation of the arithmetic, those of this block
    /// included. This takes longer than observing them.
    void countSituations()
    {
        answered(morvik_checker_count_situations(itsChecker.get()));
    }

    /// Writes these counts, for `morvik coverage`. Returns MORVIK_CHECKER_AGREES, or MORVIK_CHECKER_REFUSED after an
    /// error if there are none or the file cannot be written.
    int writeSituations(const std::string& fileName)
    {
        return answered(morvik_checker_write_situations(itsChecker.get(), fileName.c_str()));
    }

private:
    int answered(int answer)
    {
        if (answer != MORVIK_CHECKER_AGREES) {
            reportMessages();
        }
        return answer;
    }

    void reportMessages()
    {
        for (std::string text = morvik_checker_message(itsChecker.get()); !text.empty();
             text = morvik_checker_message(itsChecker.get())) {
            if (text.rfind("WARNING:", 0) == 0) {
                SC_REPORT_WARNING("morvik", text.c_str());
            } else {
                SC_REPORT_ERROR("morvik", text.c_str());
            }
        }
    }

    std::unique_ptr<morvik_checker, decltype(&morvik_checker_destroy)> itsChecker;
};

#endif
