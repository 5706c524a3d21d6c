// DecoderOptions: the options shared by all decoding subcommands.
#include "DecoderOptions.h"

#include "Arguments.h"
#include "base/Text.h"
#include "simulation/Point.h"

namespace morvik {

std::string coreText(const veltra_ip_morvik_v1_0_generics& generics, std::uint32_t iterations)
{
    return std::to_string(generics.C_NUM_PU) + " units, " +
           simulation::algorithmName(static_cast<unsigned>(generics.C_ALGORITHM_TYPE)) + ", " +
           base::counted(iterations, "iteration");
}

std::string coreLine(const veltra_ip_morvik_v1_0_generics& generics, std::uint32_t iterations)
{
    return "core: " + coreText(generics, iterations) + '\n';
}

void addDecoderOptions(CLI::App& command, DecoderOptions& options)
{
    command.add_option("--num-pu", options.generics.C_NUM_PU, "Parallel processing units: 2, 4 or 8")
        ->transform(oneOf({{"2", "2"}, {"4", "4"}, {"8", "8"}}))
        ->type_name("N")
        ->capture_default_str();
    command
        .add_option("--algorithm",
                    options.generics.C_ALGORITHM_TYPE,
                    "0 or max-log: max-log-MAP; 1 or scaled: extrinsic values times 0.75; 2 or table: correction table")
        ->transform(oneOf({{"0", "0"}, {"1", "1"}, {"2", "2"}, {"max-log", "0"}, {"scaled", "1"}, {"table", "2"}}))
        ->type_name("TYPE")
        ->default_str(simulation::algorithmName(static_cast<unsigned>(options.generics.C_ALGORITHM_TYPE)));
    command.add_option("--iterations", options.iterations, "Turbo iterations, 1 to 15")
        ->transform(integerFrom(1, 15))
        ->type_name("N")
        ->capture_default_str();
    command.add_option("--tag-width", options.generics.C_TAG_WIDTH, "Bits of the block tag, 0 to 32")
        ->transform(integerFrom(0, 32))
        ->type_name("N")
        ->capture_default_str();
}

}  // namespace morvik
