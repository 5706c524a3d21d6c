/* A C program on the library: decodes a block of all ones and one of all zeros. */
#include <stdio.h>

#include "morvik_v1_0_bitacc_cmodel.h"

enum { bits = 40, positions = bits + 4 };

/* The all-zero code word with its parity, or ones that the parity says nothing of. */
static int decode(veltra_ip_morvik_v1_0_state* state, int32_t systematic, int32_t parity, int expected)
{
    int32_t sys[positions];
    int32_t par1[positions];
    int32_t par2[positions];
    uint8_t decided[bits];
    veltra_ip_morvik_v1_0_outputs outputs;
    int i;
    for (i = 0; i < positions; ++i) {
        sys[i] = i < bits ? systematic : 0;
        par1[i] = parity;
        par2[i] = parity;
    }
    outputs.dout = decided;
    outputs.dout_alloc = bits;
    outputs.dout_size = 0;
    outputs.tag = 0;
    if (veltra_ip_morvik_v1_0_bitacc_simulate(state, sys, par1, par2, positions, 8, 5, &outputs) != 0) {
        return 1;
    }
    if (outputs.dout_size != bits || outputs.tag != 5) {
        fprintf(stderr, "size %u, tag %u\n", (unsigned)outputs.dout_size, (unsigned)outputs.tag);
        return 1;
    }
    for (i = 0; i < bits; ++i) {
        if (decided[i] != expected) {
            fprintf(stderr, "bit %d is %d\n", i, decided[i]);
            return 1;
        }
    }
    return 0;
}

int main(void)
{
    const veltra_ip_morvik_v1_0_generics generics = veltra_ip_morvik_v1_0_get_default_generics();
    veltra_ip_morvik_v1_0_state* const state = veltra_ip_morvik_v1_0_create_state(generics);
    int failed = state == NULL;
    if (!failed) {
        failed = decode(state, -64, -64, 0) || decode(state, 64, 0, 1);
    }
    veltra_ip_morvik_v1_0_destroy_state(state);
    return failed;
}
