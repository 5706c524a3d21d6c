// core: decodes a block and writes what hardware like this model would, as a dump: CSV with a row for each value of
// each pass; hardware without a fault, or with one that has a name.
#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <iostream>
#include <string>

#include "Fault.h"
#include "hardware/comparison/Model.h"
#include "src/DecoderState.h"

namespace {

using namespace morvik::comparison;
using morvik::faults::Fault;

/// What a core has that is made from now on; none when it is sound.
const Fault* chosenFault = nullptr;

const Fault* findFault(const std::string& name)
{
    for (const auto* faults :
         {&morvik::faults::softValueFaults(), &morvik::faults::borderFaults(), &morvik::faults::kernelFaults()}) {
        for (const Fault& fault : *faults) {
            if (fault.name == name) {
                return &fault;
            }
        }
    }
    return nullptr;
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

/// Arguments: the fault or "none", units, algorithm type, iterations. The block comes from standard input.
int main(int argc, char** argv)
{
    if (argc != 5) {
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
    write(computeModel(readBlock(std::cin), generics, static_cast<unsigned>(std::atoi(argv[4])), std::cerr).values);
    return 0;
}
