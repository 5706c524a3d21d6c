/* Sends a transport block over 64QAM and noise, once again with another redundancy version as long as its CRC fails. */
#include <stdio.h>
#include <stdlib.h>

#include "morvik_link.h"
#include "morvik_v1_0_batch.h"

enum { A = 8000, G = 9600, bits_per_symbol = 6, symbols = G / bits_per_symbol, iterations = 8 };

static uint32_t random_byte(void)
{
    static uint32_t state = 1;
    state = state * 1664525U + 1013904223U;
    return state >> 24;
}

/* A number whose distribution is near enough to a Gaussian one, of standard deviation 1. */
static float noise(void)
{
    int sum = 0;
    for (int i = 0; i < 12; ++i)
        sum += (int)random_byte();
    return (float)(sum - 1530) / 256;
}

/* Ends the program unless a call succeeded. */
static void expect_ok(int32_t status)
{
    if (status != MORVIK_LINK_OK) {
        fprintf(stderr, "%s\n", morvik_link_status_text(status));
        exit(1);
    }
}

/* One transmission: coded bits through modulator, channel and demodulator, added to the soft buffer. */
static void transmit(morvik_link_transport* transport, uint32_t version, const uint8_t* bits, float* buffer)
{
    static uint8_t coded[G];
    static float received[2 * symbols], ratios[G];
    const float variance = 0.05f; /* Es/N0 = 13 dB */
    expect_ok(morvik_link_transport_encode(transport, version, 1, bits, coded));
    expect_ok(morvik_link_map(bits_per_symbol, coded, symbols, received));
    for (int i = 0; i < 2 * symbols; ++i)
        received[i] += 0.158f * noise(); /* sqrt(variance / 2) */
    expect_ok(morvik_link_demap(bits_per_symbol, MORVIK_LINK_MAX_LOG, received, NULL, variance, symbols, ratios));
    expect_ok(morvik_link_transport_recover(transport, version, 1, ratios, buffer));
}

/* Decodes the code blocks; returns whether the CRC of the transport block fits. */
static int receive(morvik_link_transport* transport,
                   veltra_ip_morvik_v1_0_state* decoder,
                   const float* buffer,
                   uint8_t* decided)
{
    static int8_t sys[6148], par1[6148], par2[6148];
    static uint8_t block[6144];
    veltra_ip_morvik_v1_0_batch_outputs outputs = {0};
    outputs.dout = block;
    outputs.dout_alloc = sizeof block;
    morvik_link_places places;
    for (uint32_t r = 0; morvik_link_transport_code_block(transport, r, &places) == MORVIK_LINK_OK; ++r) {
        expect_ok(morvik_link_transport_soft_values(transport, r, 1, buffer, 4, sys, par1, par2));
        if (veltra_ip_morvik_v1_0_batch_simulate_i8(
                decoder, sys, par1, par2, (int32_t)places.size + 4, 1, iterations, NULL, &outputs) != 0)
            exit(1);
        uint8_t fits;
        expect_ok(morvik_link_transport_join(transport, r, 1, block, decided, &fits));
        printf("  code block %u of %u bits: CRC %s\n", (unsigned)r, (unsigned)places.size, fits ? "fits" : "fails");
    }
    uint8_t fits;
    expect_ok(morvik_link_transport_check(transport, 1, decided, &fits));
    return fits;
}

int main(void)
{
    morvik_link_format format = {A, G, bits_per_symbol, 1, 0};
    morvik_link_transport* transport;
    expect_ok(morvik_link_transport_create(&format, &transport));
    veltra_ip_morvik_v1_0_state* decoder =
        veltra_ip_morvik_v1_0_create_state(veltra_ip_morvik_v1_0_get_default_generics());
    float* buffer = calloc(morvik_link_transport_buffer_size(transport), sizeof *buffer);
    if (decoder == NULL || buffer == NULL)
        return 1;

    static uint8_t sent[A], decided[A + 24];
    for (int i = 0; i < A; ++i)
        sent[i] = (uint8_t)(random_byte() & 1);
    const uint32_t versions[4] = {0, 2, 3, 1};
    int fits = 0;
    for (int t = 0; t < 4 && !fits; ++t) {
        printf("redundancy version %u\n", (unsigned)versions[t]);
        transmit(transport, versions[t], sent, buffer);
        fits = receive(transport, decoder, buffer, decided);
    }
    int wrong = 0;
    for (int i = 0; i < A; ++i)
        wrong += sent[i] != decided[i];
    printf("%d of %d bits are wrong\n", wrong, A);

    free(buffer);
    veltra_ip_morvik_v1_0_destroy_state(decoder);
    morvik_link_transport_destroy(transport);
    return wrong != 0;
}
