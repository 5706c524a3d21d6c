/** @file
 * The C interface of morvik, the bit-accurate model of the morvik v1.0 LTE turbo decoder core.
 *
 * The model decodes one code block of the 3GPP LTE turbo code (3GPP TS 36.212, clause 5.1.3.2) at a
 * time and returns the very hard decisions that the hardware core returns for the same soft values
 * and the same configuration. This header is the whole contract: nothing else needs to be read to
 * use the library from C (C99) or C++, or to bind it to another language.
 *
 * @par Call order
 *   1. veltra_ip_morvik_v1_0_get_default_generics   (optional) the default configuration
 *   2. veltra_ip_morvik_v1_0_create_state           checks a configuration and builds a decoder
 *   3. veltra_ip_morvik_v1_0_bitacc_simulate        decodes one block; as often as wanted
 *   4. veltra_ip_morvik_v1_0_destroy_state          releases the decoder
 *
 * @par Messages
 *   The library reports in single lines, each written at once and flushed: errors ("ERROR:...") on the
 *   process's standard error stream, warnings ("WARNING:...") and traces on its standard output
 *   stream (std::cerr and std::cout of the C++ library that it is linked to). A program that wants
 *   them elsewhere replaces the stream buffers of those two streams around its calls.
 *
 * @par Threads
 *   The library keeps no global state. Distinct states may be used from distinct threads at the
 *   same time; one state must not be used by two threads at once.
 *
 * @par Example: decode one block of K = 40 bits, eight iterations, block tag 5
 *
 *     veltra_ip_morvik_v1_0_generics generics = veltra_ip_morvik_v1_0_get_default_generics();
 *     generics.C_NUM_PU = 4;
 *     veltra_ip_morvik_v1_0_state* state = veltra_ip_morvik_v1_0_create_state(generics);
 *     if (state == NULL) return 1;                  // the reason stands on the standard error stream
 *
 *     int sys[44], par1[44], par2[44];              // K + 4 soft values each; fill them in
 *     unsigned char bits[40];
 *     veltra_ip_morvik_v1_0_outputs outputs;
 *     outputs.dout = bits;
 *     outputs.dout_alloc = 40;
 *     if (veltra_ip_morvik_v1_0_bitacc_simulate(state, sys, par1, par2, 44, 8, 5, &outputs) == 0)
 *         use(bits, outputs.dout_size, outputs.tag);  // 40 decisions of 0 or 1, and tag 5
 *
 *     veltra_ip_morvik_v1_0_destroy_state(state);
 */
#ifndef MORVIK_V1_0_BITACC_CMODEL_H
#define MORVIK_V1_0_BITACC_CMODEL_H

#include <stdint.h>

/** Marks what the library exports; on Windows a .def file lists it. */
#if defined(__GNUC__) && !defined(_WIN32)
#define MORVIK_API __attribute__((visibility("default")))
#else
#define MORVIK_API
#endif

#ifdef __cplusplus
extern "C" {
#endif

/** The generics of the hardware core: a plain record of fourteen words, passed by value.
 *
 * The three texts are carried and never read; null is as good as any other value. The library
 * never frees them. The width generics describe the core's fixed-point formats; the model is
 * bit-accurate at one value of each, and refuses every other.
 */
typedef struct veltra_ip_morvik_v1_0_generics {
    const char* C_DIRECTORY;      /**< default "./"            not read                                */
    const char* C_FAMILY;         /**< default "halden5"       not read                                */
    const char* C_COMPONENT_NAME; /**< default "morvik_v1_0"   not read                                */
    int32_t C_RESERVED_1;         /**< default 512             not read                                */
    int32_t C_STATE_INT_WIDTH;    /**< default 9, must be 9:   integer bits of the state metrics       */
    int32_t C_STATE_FRAC_WIDTH;   /**< default 3, must be 3:   fraction bits of the state metrics      */
    int32_t C_INPUT_INT_WIDTH;    /**< default 5, must be 5:   integer bits of the soft inputs         */
    int32_t C_INPUT_FRAC_WIDTH;   /**< default 3, must be 3:   fraction bits of the soft inputs        */
    int32_t C_RESERVED_2;         /**< default 0               not read                                */
    int32_t C_RESERVED_3;         /**< default 0               not read                                */
    int32_t C_RESERVED_4;         /**< default 0               not read                                */
    int32_t C_NUM_PU;             /**< default 2; 2, 4 or 8:   parallel processing units               */
    int32_t C_TAG_WIDTH;          /**< default 8; 0 to 32:     width of the block tag in bits          */
    int32_t C_ALGORITHM_TYPE;     /**< default 1; 0 to 2:      0 max-log-MAP,
                                                             1 max-log-MAP with the extrinsic scaled by 0.75,
                                                             2 max-log-MAP with a correction table     */
} veltra_ip_morvik_v1_0_generics;

/** A decoder, made by create_state and owned by the library until destroy_state. */
typedef struct veltra_ip_morvik_v1_0_state veltra_ip_morvik_v1_0_state;

/** What a simulation call delivers. The caller owns the record and the array. */
typedef struct veltra_ip_morvik_v1_0_outputs {
    uint8_t* dout;       /**< in:  array for the hard decisions, one element for each bit             */
    uint32_t dout_alloc; /**< in:  number of elements that the array has room for                     */
    uint32_t dout_size;  /**< out: number of decisions delivered, K; each is 0 or 1                   */
    uint32_t tag;        /**< out: the block tag, masked to C_TAG_WIDTH bits                          */
} veltra_ip_morvik_v1_0_outputs;

/** Returns the default generics, the defaults of the record above. Cannot fail. */
MORVIK_API veltra_ip_morvik_v1_0_generics veltra_ip_morvik_v1_0_get_default_generics(void);

/** Checks the generics and builds a decoder from them.
 *
 * @param generics    the configuration of the core
 * @return            a state that the caller releases with destroy_state, or null after one line on the
 *                    standard error stream
 *
 * The checks run in this order and the first that fails reports:
 *
 *     ERROR:decoder:C_NUM_PU must be either 2, 4 or 8
 *     ERROR:decoder:C_TAG_WIDTH must be in range 0 to 32
 *     ERROR:decoder:C_ALGORITHM_TYPE must be in range 0 to 2
 *     ERROR:decoder:C_STATE_INT_WIDTH must be 9
 *     ERROR:decoder:C_STATE_FRAC_WIDTH must be 3
 *     ERROR:decoder:C_INPUT_INT_WIDTH must be 5
 *     ERROR:decoder:C_INPUT_FRAC_WIDTH must be 3
 *
 * Exhausted memory is reported as "ERROR:decoder:Could not allocate memory for decoder state" or
 * "ERROR:decoder:Unhandled exception has occurred". Nothing is thrown, nothing is left behind.
 */
MORVIK_API veltra_ip_morvik_v1_0_state* veltra_ip_morvik_v1_0_create_state(veltra_ip_morvik_v1_0_generics generics);

/** Releases a state and everything in it.
 *
 * @param state    what create_state returned; a null pointer is ignored
 */
MORVIK_API void veltra_ip_morvik_v1_0_destroy_state(veltra_ip_morvik_v1_0_state* state);

/** Decodes one code block of K bits.
 *
 * @param state         a live state
 * @param rsc1_sys      din_size systematic soft values, d(0) of TS 36.212
 * @param rsc1_par      din_size soft values of the first encoder's parity, d(1)
 * @param rsc2_par      din_size soft values of the second encoder's parity, d(2)
 * @param din_size      K + 4, with K one of the 188 block sizes of TS 36.212, Table 5.1.3-3 (40 to 6144)
 * @param iterations    number of full turbo iterations, 1 to 15; all of them are always run
 * @param tag           block tag, handed through to the outputs
 * @param outputs       record with `dout` and `dout_alloc` set by the caller
 *
 * Soft values: fixed-point numbers with 8 bits, 3 of them fraction: -128 to 127, in eighths. A
 * positive value favours bit 1, a negative one bit 0; the magnitude says how much. Only the low
 * 24 bits of a value count, as a two's complement number, which is clipped to -128 to 127. (16777216 is therefore read
 * as 0, without a warning.) The arrays may begin at any address.
 *
 * Tail: the last four positions carry the twelve trellis termination values in the standard's
 * order (clause 5.1.3.2.2), x and z being systematic and parity bits of the first encoder, x' and
 * z' those of the second:
 *
 *     position    rsc1_sys      rsc1_par      rsc2_par
 *     K           x(K)          z(K)          x(K+1)
 *     K + 1       z(K+1)        x(K+2)        z(K+2)
 *     K + 2       x'(K)         z'(K)         x'(K+1)
 *     K + 3       z'(K+1)       x'(K+2)       z'(K+2)
 *
 * @return a status
 *
 *      0   decoded: `dout` holds K decisions, `dout_size` is K, `tag` is the masked tag
 *      1   an argument was refused, or `dout_alloc` is less than K
 *      2   the decoder refused the block
 *     99   the decoder ran out of memory (or met another exception); so it does for a K of many millions
 *
 * On every status but 0 the outputs are left as they were, and one line tells why:
 *
 *      1   ERROR:decoder:Simulate called with null state structure
 *      1   ERROR:decoder:Simulate called with null output structure
 *      1   ERROR:decoder:Simulate called with null pointer for dout
 *      1   ERROR:decoder:din_size must be a positive integer
 *      1   ERROR:decoder:rsc1_sys must not be a null pointer
 *      1   ERROR:decoder:rsc1_par must not be a null pointer
 *      1   ERROR:decoder:rsc2_par must not be a null pointer
 *      1   ERROR:decoder:Number of iterations must be in the range 1 to 15
 *      1   ERROR:decoder:Insufficient allocated space for output array
 *      2   ERROR:TDecoder3G:Number of soft inputs does not match rate and number of tail bits
 *                                                               (din_size is less than 4)
 *      2   ERROR:TDecoder3G:Block size not supported            (K is not in the standard's table)
 *      2   ERROR:TDecoder3GPU:Block size not supported          (K does not divide into segments)
 *     99   ERROR:decoder:Unhandled exception has occurred
 *
 * A din_size of 4 (K = 0) decodes to nothing with status 0.
 *
 * Warnings, each kind once in the life of a state, on the standard output stream:
 *
 *     WARNING:decoder:RSC1 systematic value in position 7 saturated positively, further saturation will not be reported
 *     WARNING:decoder:Input block tag has been truncated to 8 bits, further truncation will not be reported
 *
 * the first with "RSC1 systematic", "RSC1 parity" or "RSC2 parity", the position counted from 0,
 * and "positively" or "negatively". A C_TAG_WIDTH of 32 keeps no bit of the tag, as 0 does: the
 * hardware forms the mask with a shift count of five bits.
 *
 * Where the components decode (morvik_v1_0_batch.h tells when), a buffer of soft values is built before the
 * decoder is called; memory exhausted at that moment leaves the function as a C++ exception, std::bad_alloc
 * or std::length_error.
 */
MORVIK_API int32_t veltra_ip_morvik_v1_0_bitacc_simulate(veltra_ip_morvik_v1_0_state* state,
                                                         const int32_t* rsc1_sys,
                                                         const int32_t* rsc1_par,
                                                         const int32_t* rsc2_par,
                                                         int32_t din_size,
                                                         uint32_t iterations,
                                                         uint32_t tag,
                                                         veltra_ip_morvik_v1_0_outputs* outputs);

#ifdef __cplusplus
} /* extern "C" */

/** Arms the decoder's trace for the next `count` soft-in/soft-out passes, two for each iteration,
 * counted across blocks; 0 switches it off. The state must be a live one.
 *
 * While the count lasts, each block prints its six input streams and each pass prints a table with
 * one row for each of the K + 3 trellis steps, on the standard output stream: the intrinsic value,
 * the forward metrics a0 to a7, the backward metrics b0 to b7, the elements g4 to g7 of the branch
 * metric column, the log-likelihood ratio and the extrinsic value. No computation writes g4 to g7,
 * the forward metrics of the last two steps, and the backward metrics of the last three; these
 * cells, and the ratio and extrinsic value of the last three steps, show zeros or what an earlier
 * block left there.
 *
 * @param state    a live state
 * @param count    number of passes, from the next one on
 *
 * A block whose size is refused prints nothing and leaves the count alone. One that is refused
 * because `dout_alloc` is too small has been decoded: it prints, and counts. What one call prints
 * comes in this order: saturation warning, input streams, tables, tag warning.
 */
MORVIK_API void veltra_ip_morvik_v1_0_bitacc_dump_config(veltra_ip_morvik_v1_0_state* state, uint32_t count);

/** Returns a new state record with a copy of the generics and no component in it, for test benches
 * that put in components of their own before any other call but destroy_state, which releases it;
 * null after a line on the standard error stream when memory is exhausted. Checks nothing.
 *
 * @param generics    what the record keeps a copy of
 */
MORVIK_API veltra_ip_morvik_v1_0_state* create_default_state(veltra_ip_morvik_v1_0_generics generics);
#endif

#endif
