/** @file
 * The LTE chain around the turbo decoder, for C (C99) and C++: CRC, segmentation, turbo code, rate matching,
 * modulation, and the receiving side of each. The library libmorvik_link implements it; it needs no other library of
 * morvik.
 *
 * The chain is that of 3GPP TS 36.212 (V10), clauses 5.1.1 to 5.1.5, and 3GPP TS 36.211 (V12), clauses 7.1.2 to 7.1.5:
 *
 *     transport block -> CRC -> code blocks with filler bits and CRC -> turbo code -> rate matching -> modulation
 *     soft values of the core <- rate recovery, sums of transmissions <- log-likelihood ratios <- received symbols
 *
 * The functions named morvik_link_transport_... do all of the first line but modulation for whole transport blocks,
 * those before them one stage each. What a decoder needs in between comes from morvik_v1_0_batch.h, whose arrays are
 * laid out as they are here.
 *
 * @par Example: a transport block of 1000 bits in 1500 bits of QPSK, and its soft values for the core
 *
 *     static uint8_t bits[1000], coded[1500];       // fill in the bits
 *     static float ratios[1500], buffer[3084];      // ratios as morvik_link_demap gives them
 *     static int8_t sys[1028], par1[1028], par2[1028];
 *     morvik_link_format format = {1000, 1500, 2, 1, 0};
 *     morvik_link_transport* transport;
 *     if (morvik_link_transport_create(&format, &transport) != MORVIK_LINK_OK) return 1;
 *     morvik_link_transport_encode(transport, 0, 1, bits, coded);
 *     morvik_link_transport_recover(transport, 0, 1, ratios, buffer);
 *     morvik_link_transport_soft_values(transport, 0, 1, buffer, 4, sys, par1, par2);
 *     morvik_link_transport_destroy(transport);
 *
 * @par Arrays
 *   The caller owns all arrays. Functions state their sizes for one block: with `blocks` blocks, "K values of each"
 *   means blocks * K values, block after block. Input arrays must not overlap output arrays. `blocks` and `count` may
 *   be 0: an array without values may be null, and where nothing is to be done, the status is MORVIK_LINK_OK unless
 *   another argument is wrong. Bits are bytes of 0 or 1, the first one sent first; only the lowest bit of a byte
 * counts.
 *
 * @par Log-likelihood ratios
 *   ln(P(1) / P(0)), as float: positive where 1 is the likelier bit, as with the core's soft values. They should be
 *   finite; NaN becomes the soft value -128. A sum beyond the range of a float becomes infinite, and so the strongest
 *   soft value. Results are the same bits on every machine.
 *
 * @par Statuses
 *   Functions return a status. Unless it is MORVIK_LINK_OK, nothing has been written; only if memory runs out may some
 *   of the blocks be done. Nothing is printed, and no C++ exception escapes.
 *
 * @par Threads
 *   The library keeps no global state. One morvik_link_transport may not be used by two threads at once.
 */
#ifndef MORVIK_LINK_H
#define MORVIK_LINK_H

#include <stddef.h>
#include <stdint.h>

/** Marks what the library exports; on Windows a .def file lists it. */
#if defined(__GNUC__) && !defined(_WIN32)
#define MORVIK_LINK_API __attribute__((visibility("default")))
#else
#define MORVIK_LINK_API
#endif

#ifdef __cplusplus
extern "C" {
#endif

/** What a function returns. Arguments are checked in the order of these numbers, MORVIK_LINK_BUFFER_SIZE last; the
 * status names the first check that fails. */
enum {
    MORVIK_LINK_OK = 0,
    MORVIK_LINK_NULL_POINTER = 1,         /**< an array or record is null, but for an array of no values           */
    MORVIK_LINK_TRANSPORT_BLOCK_SIZE = 2, /**< not 1 to 16777216                                                   */
    MORVIK_LINK_BLOCK_SIZE = 3,           /**< K is not one of the 188 block sizes                                 */
    MORVIK_LINK_FILLERS = 4,              /**< as many filler bits as K, or more                                   */
    MORVIK_LINK_BITS_PER_SYMBOL = 5,      /**< not 1, 2, 4, 6 or 8                                                 */
    MORVIK_LINK_LAYERS = 6,               /**< not 1 to 4                                                          */
    MORVIK_LINK_CODED_BITS = 7,           /**< not a multiple of the bits of a symbol on all layers, or fewer than
                                               one symbol for each code block                                      */
    MORVIK_LINK_BUFFER_SIZE = 8,          /**< the soft buffer is so small that no bit of a code block is in it    */
    MORVIK_LINK_REDUNDANCY_VERSION = 9,   /**< not 0 to 3                                                          */
    MORVIK_LINK_CODE_BLOCK = 10,          /**< there is no code block of this number                               */
    MORVIK_LINK_DEMAPPER = 11,            /**< neither MORVIK_LINK_MAX_LOG nor MORVIK_LINK_EXACT                   */
    MORVIK_LINK_NOISE_VARIANCE = 12,      /**< not a finite number above 0                                         */
    MORVIK_LINK_SCALE = 13,               /**< not a finite number above 0                                         */
    MORVIK_LINK_WIDTH = 14,               /**< not 2 to 16                                                         */
    MORVIK_LINK_OUT_OF_MEMORY = 99
};

/** @return what a status means, in English, without a full stop; "unknown status" for another number. The text lives as
 *          long as the library is loaded. */
MORVIK_LINK_API const char* morvik_link_status_text(int32_t status);

/** @return the library's version, such as "1.0.0", which lives as long as the library is loaded */
MORVIK_LINK_API const char* morvik_link_version(void);

/* ---- Single stages ---- */

/** The 24 parity bits of a transport block: TS 36.212, 5.1.1, gCRC24A. `parity` receives p_0 to p_23. Over bits
 * followed by their parity bits, all 24 are 0.
 *
 * @param bits      `count` bits
 * @param count     any number
 * @param parity    room for 24 bits
 */
MORVIK_LINK_API int32_t morvik_link_crc24a(const uint8_t* bits, size_t count, uint8_t* parity);

/** The same with gCRC24B, for the code blocks of a transport block that has several. */
MORVIK_LINK_API int32_t morvik_link_crc24b(const uint8_t* bits, size_t count, uint8_t* parity);

/** How a transport block is divided: TS 36.212, 5.1.2. The first `count_minus` code blocks have `size_minus` bits, the
 * others `size_plus`. A code block is: filler bits (the first one only), its part of the transport block and the
 * transport block's CRC, and its own CRC where there are several. */
typedef struct morvik_link_code_blocks {
    uint32_t count;       /**< code blocks (C)                          */
    uint32_t fillers;     /**< filler bits (F)                          */
    uint32_t size_plus;   /**< bits of a larger code block (K+)         */
    uint32_t count_plus;  /**< how many there are (C+)                  */
    uint32_t size_minus;  /**< bits of a smaller one (K-); 0 where C = 1 */
    uint32_t count_minus; /**< how many there are (C-)                  */
} morvik_link_code_blocks;

/** @param transport_block_size    bits without their CRC (A), 1 to 16777216
 *  @param code_blocks             receives the division */
MORVIK_LINK_API int32_t morvik_link_segment(uint32_t transport_block_size, morvik_link_code_blocks* code_blocks);

/** The turbo code: TS 36.212, 5.1.3.2. The order of the tail is that of morvik_v1_0_bitacc_cmodel.h.
 *
 * @param K         block size
 * @param blocks    number of blocks; multiples of 64 cost least
 * @param bits      K bits of each
 * @param sys       receives K + 4 bits of each: systematic (d^(0))
 * @param par1      likewise: parity of the first encoder (d^(1))
 * @param par2      likewise: parity of the second encoder (d^(2))
 */
MORVIK_LINK_API int32_t
morvik_link_turbo_encode(uint32_t K, size_t blocks, const uint8_t* bits, uint8_t* sys, uint8_t* par1, uint8_t* par2);

/** Rate matching of code blocks: TS 36.212, 5.1.4.1: sub-block interleaver, circular buffer, selection.
 *
 * @param K              block size
 * @param fillers        filler bits at the start of each block (F), fewer than K; they are not sent
 * @param buffer_size    positions of the circular buffer (N_cb), counted with its dummy and filler bits as the standard
 *                       does; 0, or more than there are, for all
 * @param version        redundancy version, 0 to 3
 * @param blocks         number of blocks
 * @param sys            K + 4 bits of each, as morvik_link_turbo_encode writes them
 * @param par1           likewise
 * @param par2           likewise
 * @param count          bits to send of each block (E)
 * @param coded          receives them
 */
MORVIK_LINK_API int32_t morvik_link_rate_match(uint32_t K,
                                               uint32_t fillers,
                                               uint32_t buffer_size,
                                               uint32_t version,
                                               size_t blocks,
                                               const uint8_t* sys,
                                               const uint8_t* par1,
                                               const uint8_t* par2,
                                               size_t count,
                                               uint8_t* coded);

/** How many values the soft buffer of a code block has: the positions of its circular buffer without dummy and filler
 * bits, which are kept in the order of the circular buffer. Arguments as above. */
MORVIK_LINK_API int32_t morvik_link_soft_buffer_size(uint32_t K,
                                                     uint32_t fillers,
                                                     uint32_t buffer_size,
                                                     uint32_t* size);

/** Rate recovery: adds received ratios to soft buffers, which are zeros before the first transmission. Repeated bits
 * are added one after the other in the order in which they were sent.
 *
 * @param K              block size
 * @param fillers        filler bits at the start of each block (F)
 * @param buffer_size    as in morvik_link_rate_match
 * @param version        redundancy version, 0 to 3
 * @param blocks         number of blocks
 * @param ratios         `count` ratios of each
 * @param count          bits that were sent of each block (E)
 * @param buffers        soft buffers, as many values of each as morvik_link_soft_buffer_size returns
 */
MORVIK_LINK_API int32_t morvik_link_rate_recover(uint32_t K,
                                                 uint32_t fillers,
                                                 uint32_t buffer_size,
                                                 uint32_t version,
                                                 size_t blocks,
                                                 const float* ratios,
                                                 size_t count,
                                                 float* buffers);

/** The same for a soft buffer of `width` bits, 2 to 16: adds integers, such as morvik_link_soft_values_i16 gives, and
 * clips each sum to -2^(width - 1) ... 2^(width - 1) - 1. */
MORVIK_LINK_API int32_t morvik_link_rate_recover_i16(uint32_t K,
                                                     uint32_t fillers,
                                                     uint32_t buffer_size,
                                                     uint32_t version,
                                                     size_t blocks,
                                                     const int16_t* ratios,
                                                     size_t count,
                                                     uint32_t width,
                                                     int16_t* buffers);

/** Puts values of soft buffers into the decoder's streams. Filler bits, which both sides know to
 * be 0, become `filler` in sys and par1: -128 for the core. Positions outside the buffer become 0.
 *
 * @param K              block size
 * @param fillers        filler bits at the start of each block (F)
 * @param buffer_size    as in morvik_link_rate_match
 * @param blocks         number of blocks
 * @param buffers        their soft buffers
 * @param filler         value of filler bits
 * @param sys            receives K + 4 values of each block
 * @param par1           likewise
 * @param par2           likewise
 */
MORVIK_LINK_API int32_t morvik_link_deinterleave(uint32_t K,
                                                 uint32_t fillers,
                                                 uint32_t buffer_size,
                                                 size_t blocks,
                                                 const float* buffers,
                                                 float filler,
                                                 float* sys,
                                                 float* par1,
                                                 float* par2);

/** The same for soft values of the core. */
MORVIK_LINK_API int32_t morvik_link_deinterleave_i8(uint32_t K,
                                                    uint32_t fillers,
                                                    uint32_t buffer_size,
                                                    size_t blocks,
                                                    const int8_t* buffers,
                                                    int8_t filler,
                                                    int8_t* sys,
                                                    int8_t* par1,
                                                    int8_t* par2);

/** The core's input: ratios times scale, rounded with halves away from 0, clipped to -128 ... 127.
 *
 * @param ratios    the ratios
 * @param count     how many there are
 * @param scale     soft value for a ratio of 1, above 0
 * @param values    receives a soft value for each
 */
MORVIK_LINK_API int32_t morvik_link_soft_values(const float* ratios, size_t count, float scale, int8_t* values);

/** The same, clipped to -2^(width - 1) ... 2^(width - 1) - 1, for a width of 2 to 16 bits. */
MORVIK_LINK_API int32_t
morvik_link_soft_values_i16(const float* ratios, size_t count, float scale, uint32_t width, int16_t* values);

/* ---- Modulation ---- */

/** Maps bits to symbols of mean energy 1: TS 36.211, 7.1.2 to 7.1.5.
 *
 * @param bits_per_symbol    2 QPSK, 4 16QAM, 6 64QAM, 8 256QAM; 1 for BPSK of one dimension, which sends 1 as +1 and 0
 *                           as -1
 * @param bits               count * bits_per_symbol bits
 * @param count              number of symbols
 * @param symbols            receives I and Q of each symbol; one number of each for BPSK
 */
MORVIK_LINK_API int32_t morvik_link_map(uint32_t bits_per_symbol, const uint8_t* bits, size_t count, float* symbols);

/** Demappers. MAX_LOG: the nearest points only, fast. EXACT: all points, exact but for the rounding of floats. */
enum { MORVIK_LINK_MAX_LOG = 0, MORVIK_LINK_EXACT = 1 };

/** The log-likelihood ratios of received symbols: gain * symbol + noise. They are finite: what is beyond the range of a
 * float becomes the largest float of its sign. So weak a noise leaves the exact demapper nothing but the nearest
 * points.
 *
 * @param bits_per_symbol    as above
 * @param demapper           MORVIK_LINK_MAX_LOG or MORVIK_LINK_EXACT
 * @param symbols            I and Q of each received symbol, finite, its phase already corrected; one number for BPSK
 * @param gains              the channel's amplitude at each symbol, finite, at least 0; or null where all are 1
 * @param noise_variance     of I and Q together (N0), above 0; the one dimension of BPSK has half of it
 * @param count              number of symbols
 * @param ratios             receives count * bits_per_symbol ratios
 */
MORVIK_LINK_API int32_t morvik_link_demap(uint32_t bits_per_symbol,
                                          int32_t demapper,
                                          const float* symbols,
                                          const float* gains,
                                          float noise_variance,
                                          size_t count,
                                          float* ratios);

/* ---- Whole transport blocks ---- */

/** How a transport block is sent. */
typedef struct morvik_link_format {
    uint32_t transport_block_size; /**< bits without their CRC (A), 1 to 16777216                             */
    uint32_t coded_bits;           /**< bits of one transmission (G)                                          */
    uint32_t bits_per_symbol;      /**< 1, 2, 4, 6 or 8 (Q_m)                                                 */
    uint32_t layers;               /**< 1 to 4 (N_L)                                                          */
    uint32_t soft_buffer_size;     /**< positions of the soft buffer for the transport block (N_IR); 0 for all */
} morvik_link_format;

/** A transmitter and receiver of one format. */
typedef struct morvik_link_transport morvik_link_transport;

/** @param format    the format
 *  @param made      receives the object, to be released with morvik_link_transport_destroy */
MORVIK_LINK_API int32_t morvik_link_transport_create(const morvik_link_format* format, morvik_link_transport** made);

/** Releases a transport. A null pointer is ignored. */
MORVIK_LINK_API void morvik_link_transport_destroy(morvik_link_transport* transport);

/** Where a code block lies. */
typedef struct morvik_link_places {
    uint32_t size;        /**< bits of the code block (K)                                */
    uint32_t fillers;     /**< filler bits at its start                                  */
    uint32_t payload;     /**< bits of the transport block with CRC that it carries      */
    uint32_t payload_at;  /**< the first of them                                         */
    uint32_t coded_bits;  /**< its bits in a transmission (E)                            */
    uint32_t coded_at;    /**< the first of them                                         */
    uint32_t buffer_size; /**< its values in the transport block's soft buffer           */
    uint32_t buffer_at;   /**< the first of them                                         */
} morvik_link_places;

/** @param transport    from morvik_link_transport_create
 *  @param r            number of a code block, from 0 on
 *  @param places       receives its places */
MORVIK_LINK_API int32_t morvik_link_transport_code_block(const morvik_link_transport* transport,
                                                         uint32_t r,
                                                         morvik_link_places* places);

/** @return values of one transport block's soft buffer; 0 for a null pointer */
MORVIK_LINK_API uint32_t morvik_link_transport_buffer_size(const morvik_link_transport* transport);

/** Encodes transport blocks: the coded bits of one transmission of each.
 *
 * @param transport    from morvik_link_transport_create
 * @param version      redundancy version, 0 to 3
 * @param blocks       number of transport blocks
 * @param bits         transport_block_size bits of each
 * @param coded        receives coded_bits bits of each
 */
MORVIK_LINK_API int32_t morvik_link_transport_encode(
    morvik_link_transport* transport, uint32_t version, size_t blocks, const uint8_t* bits, uint8_t* coded);

/** Adds a transmission to soft buffers, which are zeros before the first one.
 *
 * @param transport    from morvik_link_transport_create
 * @param version      redundancy version, 0 to 3
 * @param blocks       number of transport blocks
 * @param ratios       coded_bits ratios of each
 * @param buffers      their soft buffers
 */
MORVIK_LINK_API int32_t morvik_link_transport_recover(
    const morvik_link_transport* transport, uint32_t version, size_t blocks, const float* ratios, float* buffers);

/** The same with soft buffers of `width` bits, as in morvik_link_rate_recover_i16. */
MORVIK_LINK_API int32_t morvik_link_transport_recover_i16(const morvik_link_transport* transport,
                                                          uint32_t version,
                                                          size_t blocks,
                                                          const int16_t* ratios,
                                                          uint32_t width,
                                                          int16_t* buffers);

/** Code block r of each transport block as the core takes it: the soft buffer, scaled, rounded, clipped and put into
 * streams, filler bits as -128.
 *
 * @param transport    from morvik_link_transport_create
 * @param r            number of the code block, from 0 on
 * @param blocks       number of transport blocks
 * @param buffers      their soft buffers
 * @param scale        soft value for a ratio of 1, above 0
 * @param sys          receives K + 4 values of each transport block, K being the size of code block r
 * @param par1         likewise
 * @param par2         likewise
 */
MORVIK_LINK_API int32_t morvik_link_transport_soft_values(const morvik_link_transport* transport,
                                                          uint32_t r,
                                                          size_t blocks,
                                                          const float* buffers,
                                                          float scale,
                                                          int8_t* sys,
                                                          int8_t* par1,
                                                          int8_t* par2);

/** The same from soft buffers of integers, which are only clipped. */
MORVIK_LINK_API int32_t morvik_link_transport_soft_values_i16(const morvik_link_transport* transport,
                                                              uint32_t r,
                                                              size_t blocks,
                                                              const int16_t* buffers,
                                                              int8_t* sys,
                                                              int8_t* par1,
                                                              int8_t* par2);

/** Puts decisions on code block r of each transport block into the transport blocks.
 *
 * @param transport    from morvik_link_transport_create
 * @param r            number of the code block, from 0 on
 * @param blocks       number of transport blocks
 * @param decisions    K decisions of each
 * @param bits         transport_block_size + 24 bits of each; only those that code block r carries are written
 * @param fits         receives 1 for each code block whose CRC fits, otherwise 0: its own CRC where there are
 *                     several, else the transport block's; or null
 */
MORVIK_LINK_API int32_t morvik_link_transport_join(const morvik_link_transport* transport,
                                                   uint32_t r,
                                                   size_t blocks,
                                                   const uint8_t* decisions,
                                                   uint8_t* bits,
                                                   uint8_t* fits);

/** Checks the CRC of transport blocks.
 *
 * @param transport    from morvik_link_transport_create
 * @param blocks       number of transport blocks
 * @param bits         transport_block_size + 24 bits of each
 * @param fits         receives 1 for each transport block whose CRC fits, otherwise 0
 */
MORVIK_LINK_API int32_t morvik_link_transport_check(const morvik_link_transport* transport,
                                                    size_t blocks,
                                                    const uint8_t* bits,
                                                    uint8_t* fits);

#ifdef __cplusplus
} /* extern "C" */
#endif

#endif
