// state_fuzz: the state creation takes any generics, and accepts the documented ones alone.
#include "FuzzInput.h"
#include "morvik_v1_0_bitacc_cmodel.h"

namespace {

/// Mostly near the accepted value, sometimes anything.
std::int32_t around(FuzzInput& input, std::int32_t accepted)
{
    const unsigned choice = input.below(8);
    return choice < 5   ? accepted
           : choice < 7 ? accepted + static_cast<std::int32_t>(input.below(5)) - 2
                        : input.integer();
}

bool allowed(const veltra_ip_morvik_v1_0_generics& g)
{
    return (g.C_NUM_PU == 2 || g.C_NUM_PU == 4 || g.C_NUM_PU == 8) && g.C_TAG_WIDTH >= 0 && g.C_TAG_WIDTH <= 32 &&
           g.C_ALGORITHM_TYPE >= 0 && g.C_ALGORITHM_TYPE <= 2 && g.C_STATE_INT_WIDTH == 9 &&
           g.C_STATE_FRAC_WIDTH == 3 && g.C_INPUT_INT_WIDTH == 5 && g.C_INPUT_FRAC_WIDTH == 3;
}

}  // namespace

int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size)
{
    const SilencedStreams silenced;
    FuzzInput input(data, size);
    veltra_ip_morvik_v1_0_generics g = veltra_ip_morvik_v1_0_get_default_generics();
    g.C_STATE_INT_WIDTH = around(input, 9);
    g.C_STATE_FRAC_WIDTH = around(input, 3);
    g.C_INPUT_INT_WIDTH = around(input, 5);
    g.C_INPUT_FRAC_WIDTH = around(input, 3);
    g.C_NUM_PU = around(input, 4);
    g.C_TAG_WIDTH = around(input, 32);
    g.C_ALGORITHM_TYPE = around(input, 2);
    g.C_RESERVED_1 = input.integer();
    g.C_FAMILY = input.below(2) == 0 ? nullptr : "";
    veltra_ip_morvik_v1_0_state* const state = veltra_ip_morvik_v1_0_create_state(g);
    require((state != nullptr) == allowed(g), "a state is made of allowed generics, and of no others");
    veltra_ip_morvik_v1_0_destroy_state(state);
    veltra_ip_morvik_v1_0_destroy_state(create_default_state(g));
    return 0;
}
