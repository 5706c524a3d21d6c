// core: decodes a block and writes what hardware like this model would, as a dump: CSV with a row for each value of
// each pass; hardware without a fault, or with one that has a name. Or as a replay, for test benches: see writeReplay.
#include <algorithm>
#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <iostream>
#include <string>
#include <vector>

#include "Fault.h"
#include "hardware/comparison/Model.h"
#include "src/DecoderState.h"

namespace {

using namespace morvik::comparison;
using morvik::faults::Fault;

/// What a core has that is made from now on; none when it is sound.
const Fault* chosenFault = nullptr;

std::vector<const Fault*> allFaults()
{
    std::vector<const Fault*> all;
    for (const auto* faults :
         {&morvik::faults::softValueFaults(), &morvik::faults::borderFaults(), &morvik::faults::kernelFaults()}) {
        for (const Fault& fault : *faults) {
            all.push_back(&fault);
        }
    }
    return all;
}

const Fault* findFault(const std::string& name)
{
    const std::vector<const Fault*> all = allFaults();
    const auto found = std::find_if(all.begin(), all.end(), [&](const Fault* fault) { return fault->name == name; });
    return found != all.end() ? *found : nullptr;
}

/// Puts the component with the fault in the place of the sound one.
void install(const Fault& fault, veltra_ip_morvik_v1_0_state& state)
{
    if (fault.engine != nullptr) {
        auto engine = fault.engine(dynamic_cast<const TCalculationEngineModBase&>(*state.engine));
        // The tables are those of the sound engine, which stays.
        static std::vector<std::unique_ptr<TCalculationEngine>> sound;
        sound.emplace_back(state.engine);
        state.engine = engine.release();
        state.decoder->itsEngine = state.engine;
    } else {
        auto decoder = fault.decoder(dynamic_cast<const TDecoder3GPU&>(*state.decoder));
        delete state.decoder;
        state.decoder = decoder.release();
    }
}

/// The first block of soft values, as the command takes them.
morvik::SoftBlock readBlock(std::istream& input)
{
    morvik::SoftBlock block;
    std::string line;
    std::getline(input, line);  // the header
    while (std::getline(input, line)) {
        int label = 0;
        int values[3] = {};
        const int read = std::sscanf(line.c_str(), "%d,%d,%d,%d", &label, &values[0], &values[1], &values[2]);
        if (read != 4 || label != 0) {
            break;
        }
        block.rsc1Sys.push_back(values[0]);
        block.rsc1Par.push_back(values[1]);
        block.rsc2Par.push_back(values[2]);
    }
    return block;
}

void write(const Values& values)
{
    std::cout << "half_iteration,step,signal,value\n";
    for (unsigned pass = 0; pass < values.passes(); ++pass) {
        for (unsigned step = 0; step < values.steps(); ++step) {
            for (unsigned signal = 0; signal < morvik::signalCount; ++signal) {
                const Place place = {pass, signal, step};
                if (values.has(place)) {
                    std::cout << pass << ',' << step << ',' << morvik::passSignals[signal].name << ','
                              << values.at(place) << '\n';
                }
            }
        }
    }
}

/// Numbers between white space: units, algorithm, iterations and positions; the block; then, in the order of
/// computation, what each operation gives: signal, half-iteration, step, and eight values, the last of which are 0
/// where there are fewer.
void writeReplay(const morvik::SoftBlock& block, const Model& model)
{
    std::cout << model.generics.C_NUM_PU << ' ' << model.generics.C_ALGORITHM_TYPE << ' ' << model.values.passes() / 2
              << ' ' << block.size() << '\n';
    for (std::size_t i = 0; i < block.size(); ++i) {
        std::cout << block.rsc1Sys[i] << ' ' << block.rsc1Par[i] << ' ' << block.rsc2Par[i] << '\n';
    }
    for (unsigned pass = 0; pass < model.values.passes(); ++pass) {
        for (const morvik::Stage stage : morvik::stages) {
            const auto [first, count] = morvik::signalsOf(stage);
            for (const unsigned step : stepsInOrder(model.cut, stage)) {
                std::cout << first << ' ' << pass << ' ' << step;
                for (unsigned i = 0; i < 8; ++i) {
                    std::cout << ' ' << (i < count ? model.values.at({pass, first + i, step}) : 0);
                }
                std::cout << '\n';
            }
        }
    }
}

}  // namespace

// The linker puts the second function in the place of the library's, which becomes the first. The names are its own.
// NOLINTBEGIN(bugprone-reserved-identifier)
extern "C" decltype(veltra_ip_morvik_v1_0_create_state) __real_veltra_ip_morvik_v1_0_create_state;
extern "C" decltype(veltra_ip_morvik_v1_0_create_state) __wrap_veltra_ip_morvik_v1_0_create_state;

veltra_ip_morvik_v1_0_state* __wrap_veltra_ip_morvik_v1_0_create_state(veltra_ip_morvik_v1_0_generics generics)
{
    veltra_ip_morvik_v1_0_state* const state = __real_veltra_ip_morvik_v1_0_create_state(generics);
    if (state != nullptr && chosenFault != nullptr) {
        install(*chosenFault, *state);
    }
    return state;
}
// NOLINTEND(bugprone-reserved-identifier)

/// Arguments: the fault or "none", units, algorithm type, iterations, and perhaps "replay". The block comes from
/// standard input. "list" alone prints the names of all faults.
int main(int argc, char** argv)
{
    if (argc == 2 && std::string(argv[1]) == "list") {
        for (const Fault* fault : allFaults()) {
            std::cout << fault->name << '\n';
        }
        return 0;
    }
    const bool isReplay = argc == 6 && std::string(argv[5]) == "replay";
    if (argc != 5 && !isReplay) {
        return 2;
    }
    const std::string name = argv[1];
    chosenFault = findFault(name);
    if (chosenFault == nullptr && name != "none") {
        std::cerr << "fault_core: no fault '" << name << "'\n";
        return 2;
    }
    std::ios::sync_with_stdio(false);
    veltra_ip_morvik_v1_0_generics generics = veltra_ip_morvik_v1_0_get_default_generics();
    generics.C_NUM_PU = std::atoi(argv[2]);
    generics.C_ALGORITHM_TYPE = std::atoi(argv[3]);
    const morvik::SoftBlock block = readBlock(std::cin);
    const Model model = computeModel(block, generics, static_cast<unsigned>(std::atoi(argv[4])), std::cerr);
    if (isReplay) {
        writeReplay(block, model);
    } else {
        write(model.values);
    }
    return 0;
}
