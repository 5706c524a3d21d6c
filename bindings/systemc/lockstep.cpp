// lockstep: a stand-in for a core gives the values of a replay, one operation in each clock, and the checker stops it
// at the first wrong one.
//
//     systemc_lockstep REPLAY   written by fault_core ... replay
#include <algorithm>
#include <array>
#include <exception>
#include <fstream>
#include <iostream>
#include <systemc>
#include <vector>

#include "MorvikChecker.h"

namespace {

/// Hands one operation to the checker in each clock.
class Core : public sc_core::sc_module {
public:
    Core(const sc_core::sc_module_name& name, std::istream& replay, MorvikChecker& checker)
        : sc_module(name), itsReplay(replay), itsChecker(checker)
    {
        SC_HAS_PROCESS(Core);
        SC_THREAD(run);
    }

private:
    void run()
    {
        int signal = 0;
        int pass = 0;
        int step = 0;
        std::array<std::int32_t, 8> row{};
        while (itsReplay >> signal >> pass >> step) {
            for (std::int32_t& value : row) {
                itsReplay >> value;
            }
            wait(sc_core::sc_time(1, sc_core::SC_NS));
            if (signal == MORVIK_CHECKER_G) {
                itsChecker.observeRow(signal, pass, step, std::array<std::int32_t, 4>{row[0], row[1], row[2], row[3]});
            } else if (signal == MORVIK_CHECKER_ALPHA || signal == MORVIK_CHECKER_BETA) {
                itsChecker.observeRow(signal, pass, step, row);
            } else {
                itsChecker.observe(signal, pass, step, sc_dt::sc_lv<12>(row[0]));
            }
        }
    }

    std::istream& itsReplay;
    MorvikChecker& itsChecker;
};

}  // namespace

int sc_main(int argc, char** argv)
{
    if (argc != 2) {
        std::cerr << "systemc_lockstep REPLAY\n";
        return 2;
    }
    std::ifstream replay(argv[1]);
    int units = 0;
    int algorithm = 0;
    int iterations = 0;
    std::size_t positions = 0;
    replay >> units >> algorithm >> iterations >> positions;
    std::array<std::vector<std::int32_t>, 3> streams;
    for (std::size_t i = 0; i < 3 * positions; ++i) {
        replay >> streams[i % 3].emplace_back();
    }
    try {
        MorvikChecker checker(units, algorithm);
        checker.start(streams[0], streams[1], streams[2], iterations);
        const Core core("core", replay, checker);
        sc_core::sc_start();
        if (checker.report() == MORVIK_CHECKER_AGREES) {
            std::cout << "the core agrees\n";
        }
        return 0;
    } catch (const std::exception& error) {
        std::cerr << error.what() << "\nstopped\n";
        return 1;
    }
}
