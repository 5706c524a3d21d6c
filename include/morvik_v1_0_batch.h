/** @file
 * The batch interface of morvik: many code blocks of one size in one call, for simulations.
 *
 * It works on the states of morvik_v1_0_bitacc_cmodel.h, which says what a state, a soft value, the tail
 * and a message are. A batch gives what the same blocks give when they are handed one after the other to
 * veltra_ip_morvik_v1_0_bitacc_simulate: the same decisions and tags, the same warnings in the same
 * order, each kind once in the life of a state. Positions in warnings count within their block. Calls of
 * both headers may alternate on one state.
 *
 * @par Example: 1000 blocks of K = 512, eight iterations, soft values of 8 bits
 *
 *     enum { blocks = 1000, K = 512 };
 *     static int8_t sys[blocks][K + 4], par1[blocks][K + 4], par2[blocks][K + 4];   // fill them in
 *     static uint8_t bits[blocks][K];
 *     veltra_ip_morvik_v1_0_batch_outputs outputs = {0};
 *     outputs.dout = bits[0];
 *     outputs.dout_alloc = sizeof bits;
 *     int32_t status = veltra_ip_morvik_v1_0_batch_simulate_i8(
 *         state, sys[0], par1[0], par2[0], K + 4, blocks, 8, NULL, &outputs);
 */
#ifndef MORVIK_V1_0_BATCH_H
#define MORVIK_V1_0_BATCH_H

#include <stddef.h>
#include <stdint.h>

#include "morvik_v1_0_bitacc_cmodel.h"

#ifdef __cplusplus
extern "C" {
#endif

/** What a batch delivers, block after block. The caller owns the record and the arrays; a member that is
 * null is not wanted, but for `dout`.
 */
typedef struct veltra_ip_morvik_v1_0_batch_outputs {
    uint8_t* dout;       /**< in:  hard decisions, K for each block, each 0 or 1                            */
    size_t dout_alloc;   /**< in:  number of elements that `dout` has room for                              */
    int16_t* ratios;     /**< in:  log-likelihood ratios of the last pass, K for each block, or null; in
                                 units of 1/128, multiples of 16, positive for bit 1. They wrap like the
                                 hardware's 12-bit metrics                                                  */
    size_t ratios_alloc; /**< in:  number of elements that `ratios` has room for                            */
    uint32_t* tags;      /**< in:  block tags, masked to C_TAG_WIDTH bits, one for each block, or null      */
    size_t tags_alloc;   /**< in:  number of elements that `tags` has room for                              */
    uint32_t dout_size;  /**< out: number of decisions of each block, K                                     */
} veltra_ip_morvik_v1_0_batch_outputs;

/** Decodes `blocks` code blocks of K bits each.
 *
 * @param state         a live state
 * @param rsc1_sys      systematic soft values, `blocks` times din_size of them, block after block
 * @param rsc1_par      those of the first encoder's parity, likewise
 * @param rsc2_par      those of the second encoder's parity, likewise
 * @param din_size      positions of one block, K + 4
 * @param blocks        number of blocks; 0 decodes nothing and returns 0
 * @param iterations    number of full turbo iterations, 1 to 15
 * @param tags          one tag for each block, or null: all tags are 0
 * @param outputs       record with the "in" members set by the caller
 *
 * The three functions differ in the caller's type of soft values alone: 32, 16 and 8 bits.
 *
 * @return 0, or the status of the first block that is refused, with its line on the standard error
 *         stream, as veltra_ip_morvik_v1_0_bitacc_simulate does
 *
 * All blocks share what is checked, so a batch is decoded as a whole or not at all; on every status but 0
 * the outputs are left as they were, but for an exhausted memory (99), where the blocks before may have
 * been delivered. Two more reasons for status 1:
 *
 *     ERROR:decoder:Insufficient allocated space for ratios array
 *     ERROR:decoder:Insufficient allocated space for tags array
 *
 * Input arrays must not overlap output arrays. All arrays may begin at any address. Exhausted memory is
 * always status 99; no function of this header lets a C++ exception out.
 */
MORVIK_API int32_t veltra_ip_morvik_v1_0_batch_simulate_i32(veltra_ip_morvik_v1_0_state* state,
                                                            const int32_t* rsc1_sys,
                                                            const int32_t* rsc1_par,
                                                            const int32_t* rsc2_par,
                                                            int32_t din_size,
                                                            uint32_t blocks,
                                                            uint32_t iterations,
                                                            const uint32_t* tags,
                                                            veltra_ip_morvik_v1_0_batch_outputs* outputs);

/** The same as veltra_ip_morvik_v1_0_batch_simulate_i32, from soft values of 16 bits. */
MORVIK_API int32_t veltra_ip_morvik_v1_0_batch_simulate_i16(veltra_ip_morvik_v1_0_state* state,
                                                            const int16_t* rsc1_sys,
                                                            const int16_t* rsc1_par,
                                                            const int16_t* rsc2_par,
                                                            int32_t din_size,
                                                            uint32_t blocks,
                                                            uint32_t iterations,
                                                            const uint32_t* tags,
                                                            veltra_ip_morvik_v1_0_batch_outputs* outputs);

/** The same as veltra_ip_morvik_v1_0_batch_simulate_i32, from soft values of 8 bits. */
MORVIK_API int32_t veltra_ip_morvik_v1_0_batch_simulate_i8(veltra_ip_morvik_v1_0_state* state,
                                                           const int8_t* rsc1_sys,
                                                           const int8_t* rsc1_par,
                                                           const int8_t* rsc2_par,
                                                           int32_t din_size,
                                                           uint32_t blocks,
                                                           uint32_t iterations,
                                                           const uint32_t* tags,
                                                           veltra_ip_morvik_v1_0_batch_outputs* outputs);

/** Decodes `blocks` code blocks and counts the decisions that are wrong after each full iteration, for
 * error-rate simulations. Decoding, refusals and warnings are those of the batch functions above.
 *
 * @param state           a live state
 * @param rsc1_sys        the three streams, as above
 * @param rsc1_par        likewise
 * @param rsc2_par        likewise
 * @param din_size        positions of one block, K + 4
 * @param blocks          number of blocks
 * @param iterations      number of full turbo iterations, 1 to 15
 * @param sent            the bits that were sent, K for each block, zero or not zero
 * @param errors          out: [block][iteration], the wrong decisions of the block after that full
 *                        iteration; the last count of a block is that of its decisions with
 *                        `iterations` iterations
 * @param errors_alloc    number of elements that `errors` has room for
 *
 * @return a status, as above
 *
 * Status 1 also has these reasons:
 *
 *     ERROR:decoder:Simulate called with null pointer for sent
 *     ERROR:decoder:Simulate called with null pointer for errors
 *     ERROR:decoder:Insufficient allocated space for errors array
 */
MORVIK_API int32_t veltra_ip_morvik_v1_0_batch_count_errors_i32(veltra_ip_morvik_v1_0_state* state,
                                                                const int32_t* rsc1_sys,
                                                                const int32_t* rsc1_par,
                                                                const int32_t* rsc2_par,
                                                                int32_t din_size,
                                                                uint32_t blocks,
                                                                uint32_t iterations,
                                                                const uint8_t* sent,
                                                                uint32_t* errors,
                                                                size_t errors_alloc);

/** The same as veltra_ip_morvik_v1_0_batch_count_errors_i32, from soft values of 16 bits. */
MORVIK_API int32_t veltra_ip_morvik_v1_0_batch_count_errors_i16(veltra_ip_morvik_v1_0_state* state,
                                                                const int16_t* rsc1_sys,
                                                                const int16_t* rsc1_par,
                                                                const int16_t* rsc2_par,
                                                                int32_t din_size,
                                                                uint32_t blocks,
                                                                uint32_t iterations,
                                                                const uint8_t* sent,
                                                                uint32_t* errors,
                                                                size_t errors_alloc);

/** The same as veltra_ip_morvik_v1_0_batch_count_errors_i32, from soft values of 8 bits. */
MORVIK_API int32_t veltra_ip_morvik_v1_0_batch_count_errors_i8(veltra_ip_morvik_v1_0_state* state,
                                                               const int8_t* rsc1_sys,
                                                               const int8_t* rsc1_par,
                                                               const int8_t* rsc2_par,
                                                               int32_t din_size,
                                                               uint32_t blocks,
                                                               uint32_t iterations,
                                                               const uint8_t* sent,
                                                               uint32_t* errors,
                                                               size_t errors_alloc);

/** Chooses how a state computes. A new state takes the best way that the machine has; all give the same bits.
 *
 *     avx512, avx2, ssse3    one lane for each segment of a block, on vectors of that instruction set of x86
 *     neon                   the same on those of 64-bit ARM
 *     generic                the same on what every machine has
 *     component              the components of the model one by one
 *
 * Whatever is chosen, the components decode where a trace is armed, where a test bench has preset extrinsic
 * values, and where it has put in components of its own or changed what they hold. (Of the correction table
 * of algorithm type 2, entries of differences of 64 steps or more, where the hardware has no corrections,
 * are not looked at: choose "component" to decode with others there.)
 *
 * @param state    a live state
 * @param name     one of these names
 * @return 0; 1 after one line on the standard error stream when the name is another or the machine lacks it;
 *         99 after the line of the other calls when memory is exhausted, and nothing is changed
 */
MORVIK_API int32_t veltra_ip_morvik_v1_0_set_instruction_set(veltra_ip_morvik_v1_0_state* state, const char* name);

/** Tells how a state computes.
 *
 * @param state    a live state
 * @return the name in use, one of those above: "component" also while a component is not what create_state made
 */
MORVIK_API const char* veltra_ip_morvik_v1_0_get_instruction_set(const veltra_ip_morvik_v1_0_state* state);

#ifdef __cplusplus
} /* extern "C" */
#endif

#endif
