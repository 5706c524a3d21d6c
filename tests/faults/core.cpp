// core: decodes a block and writes what hardware like this model would, as a dump: CSV with a row for each value of
// each pass. It is built once as it is, and once with each of the faults.
#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <iostream>
#include <string>

#include "hardware/comparison/Model.h"

namespace {

using namespace morvik::comparison;

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
            for (unsigned signal = 0; signal < signalCount; ++signal) {
                const Place place = {pass, signal, step};
                if (values.has(place)) {
                    std::cout << pass << ',' << step << ',' << morvik::passSignals[signal] << ',' << values.at(place)
                              << '\n';
                }
            }
        }
    }
}

}  // namespace

/// Arguments: units, algorithm type, iterations. The block comes from standard input.
int main(int argc, char** argv)
{
    if (argc != 4) {
        return 2;
    }
    std::ios::sync_with_stdio(false);
    veltra_ip_morvik_v1_0_generics generics = veltra_ip_morvik_v1_0_get_default_generics();
    generics.C_NUM_PU = std::atoi(argv[1]);
    generics.C_ALGORITHM_TYPE = std::atoi(argv[2]);
    write(computeModel(readBlock(std::cin), generics, static_cast<unsigned>(std::atoi(argv[3])), std::cerr).values);
    return 0;
}
