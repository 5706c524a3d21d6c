/* Decodes many blocks in one call, and counts the wrong decisions after each iteration. */
#include <stdio.h>

#include "morvik_v1_0_batch.h"

enum { K = 512, blocks = 100, iterations = 8 };

/* A value from -255 to 255 whose distribution is near enough to a Gaussian one: four random bytes, as a sum. */
static int noise(void)
{
    static uint32_t state = 1;
    int sum = 0;
    for (int i = 0; i < 4; ++i) {
        state = state * 1664525U + 1013904223U;
        sum += (int)(state >> 24);
    }
    return sum / 2 - 255;
}

/* Sends bits 0 as -8 over a channel whose noise has a standard deviation of 9.2. */
static void receive(int8_t* values)
{
    for (int i = 0; i < blocks * (K + 4); ++i)
        values[i] = (int8_t)(-8 + noise() / 8);
}

int main(void)
{
    static int8_t sys[blocks * (K + 4)], par1[blocks * (K + 4)], par2[blocks * (K + 4)];
    receive(sys);
    receive(par1);
    receive(par2);
    unsigned wrong = 0;
    for (int i = 0; i < blocks * (K + 4); ++i)
        wrong += sys[i] > 0;
    printf("received: %.1f %% of the systematic values have the wrong sign\n", 100.0 * wrong / (blocks * (K + 4)));

    veltra_ip_morvik_v1_0_state* state =
        veltra_ip_morvik_v1_0_create_state(veltra_ip_morvik_v1_0_get_default_generics());
    if (state == NULL)
        return 1;

    static uint8_t bits[blocks * K];
    static int16_t ratios[blocks * K];
    veltra_ip_morvik_v1_0_batch_outputs outputs = {0};
    outputs.dout = bits;
    outputs.dout_alloc = sizeof bits;
    outputs.ratios = ratios;
    outputs.ratios_alloc = blocks * K;
    int32_t status =
        veltra_ip_morvik_v1_0_batch_simulate_i8(state, sys, par1, par2, K + 4, blocks, iterations, NULL, &outputs);
    if (status != 0)
        return status;
    printf("first decision %u, its log-likelihood ratio %.3f\n", (unsigned)bits[0], ratios[0] / 128.0);

    static const uint8_t sent[blocks * K]; /* zeros */
    static uint32_t errors[blocks][iterations];
    status = veltra_ip_morvik_v1_0_batch_count_errors_i8(
        state, sys, par1, par2, K + 4, blocks, iterations, sent, errors[0], blocks * iterations);
    for (int n = 0; n < iterations; ++n) {
        unsigned bit_errors = 0, block_errors = 0;
        for (int b = 0; b < blocks; ++b) {
            bit_errors += errors[b][n];
            block_errors += errors[b][n] > 0;
        }
        printf("iteration %d: %5u bit errors, %3u block errors\n", n + 1, bit_errors, block_errors);
    }
    veltra_ip_morvik_v1_0_destroy_state(state);
    return status;
}
