/* Decodes one block, and shows what a refused call looks like. */
#include <stdio.h>

#include "morvik_v1_0_bitacc_cmodel.h"

enum { K = 40 };

int main(void)
{
    veltra_ip_morvik_v1_0_generics generics = veltra_ip_morvik_v1_0_get_default_generics();
    generics.C_NUM_PU = 4;
    veltra_ip_morvik_v1_0_state* state = veltra_ip_morvik_v1_0_create_state(generics);
    if (state == NULL)
        return 1; /* the reason stands on the standard error stream */

    /* All bits 0 is a code word: sent as -1, a soft value of -8, here with every tenth value received wrong. */
    int32_t sys[K + 4], par1[K + 4], par2[K + 4];
    for (int i = 0; i < K + 4; ++i) {
        sys[i] = i % 10 == 0 ? 8 : -8;
        par1[i] = i % 10 == 1 ? 8 : -8;
        par2[i] = i % 10 == 2 ? 8 : -8;
    }

    uint8_t bits[K];
    veltra_ip_morvik_v1_0_outputs outputs = {.dout = bits, .dout_alloc = K};
    int32_t status = veltra_ip_morvik_v1_0_bitacc_simulate(state, sys, par1, par2, K + 4, 8, 5, &outputs);
    unsigned ones = 0;
    for (uint32_t i = 0; i < outputs.dout_size; ++i)
        ones += bits[i];
    printf("status %d, %u bits, %u of them wrong, tag %u\n",
           (int)status,
           (unsigned)outputs.dout_size,
           ones,
           (unsigned)outputs.tag);

    /* The tail is missing: a line on the standard error stream says "Block size not supported". */
    status = veltra_ip_morvik_v1_0_bitacc_simulate(state, sys, par1, par2, K, 8, 5, &outputs);
    printf("without the tail: status %d\n", (int)status);

    veltra_ip_morvik_v1_0_destroy_state(state);
    return 0;
}
