/** @file
 * The units of the core as functions, for C (C99) and C++: what one unit of the hardware computes from its inputs, so
 * that it can be tested before there is a whole core. The library libmorvik_checker has these functions; it needs no
 * other one of morvik's. `morvik vectors --unit` makes stimulus with expected values for each of them.
 *
 * @par Example: a step of the forward recursion
 *
 *     int32_t alpha[8] = {0, -1024, -1024, -1024, -1024, -1024, -1024, -1024}; // the encoder is in state 0
 *     int32_t twice, g[4], next[8];
 *     morvik_unit_intrinsic(10, -24, &twice);                                  // a-priori and systematic value
 *     morvik_unit_branch(twice, 16, g);                                        // parity
 *     int status = morvik_unit_forward(1, alpha, NULL, g, next, NULL);         // scaled: nothing is pending
 *     if (status != MORVIK_UNIT_OK) puts(morvik_unit_status_text(status));
 *
 * @par Values
 *   All values are integers in eighths, as the core's registers hold them in two's complement. A register that clips or
 *   wraps does so in the function that computes it. An input outside of its register's range is a mistake of the
 *   caller, such as a sign that was not extended: it is refused, never clipped or wrapped.
 *
 * | value                       | bits | range         |
 * |-----------------------------|------|---------------|
 * | soft value, parity          | 8    | -128 to 127   |
 * | a-priori or extrinsic value | 8    | -128 to 127   |
 * | twice the intrinsic value   | 9    | -192 to 190   |
 * | branch metric               | 8    | -128 to 127   |
 * | metric of a state, ratio    | 12   | -2048 to 2047 |
 * | pending correction          | 3    | 0 to 6        |
 *
 * @par Rows
 *   Columns of metrics are arrays of eight, state 0 first; branch metrics are four, of which the third equals the
 * second and the fourth the first in this code. An array of results may be one of the inputs.
 *
 * @par Pending corrections
 *   The algorithm with a table (2) adds the correction of a decision one decision later, so that a column of a
 * recursion carries a correction with each metric. A recursion starts with zeros: the forward one at the beginning of a
 * segment, the backward one at the end of a window. With algorithms 0 and 1 all of them are 0.
 *
 * @par Statuses
 *   Functions return a status. Unless it is MORVIK_UNIT_OK, nothing has been written. Nothing is printed, and no C++
 *   exception gets out.
 *
 * @par Threads
 *   The functions keep nothing between calls, and any number of threads may call them at once.
 */
#ifndef MORVIK_UNITS_H
#define MORVIK_UNITS_H

#include <stdint.h>

/** Marks what the library exports; on Windows a .def file lists it. */
#if defined(__GNUC__) && !defined(_WIN32)
#define MORVIK_UNITS_API __attribute__((visibility("default")))
#else
#define MORVIK_UNITS_API
#endif

#ifdef __cplusplus
extern "C" {
#endif

/** What a function returns. Arguments are checked in the order of these numbers; the status names the first check that
 * fails. */
enum {
    MORVIK_UNIT_OK = 0,
    MORVIK_UNIT_NULL_POINTER = 1,
    MORVIK_UNIT_ALGORITHM = 2,       /**< not 0 to 2                                                      */
    MORVIK_UNIT_SOFT_VALUE = 3,      /**< a systematic or parity value is not from -128 to 127            */
    MORVIK_UNIT_APRIORI = 4,         /**< the a-priori value is not from -128 to 127                      */
    MORVIK_UNIT_TWICE_INTRINSIC = 5, /**< twice the intrinsic value is not from -192 to 190               */
    MORVIK_UNIT_BRANCH_METRIC = 6,   /**< a branch metric is not from -128 to 127                         */
    MORVIK_UNIT_METRIC = 7,          /**< a metric of a state or the ratio is not from -2048 to 2047      */
    MORVIK_UNIT_PENDING = 8,         /**< a pending correction is not from 0 to 6, or not 0 without table */
    MORVIK_UNIT_BLOCK_SIZE = 9,      /**< K is not one of the 188 block sizes                             */
    MORVIK_UNIT_STEP = 10,           /**< not from 0 to K - 1                                             */
    MORVIK_UNIT_OUT_OF_MEMORY = 99
};

/** What a status means.
 *
 * @param status    what a function returned
 * @return          a text in English, without a full stop; "unknown status" for another number. It lives as long as the
 *                  library is loaded
 */
MORVIK_UNITS_API const char* morvik_unit_status_text(int32_t status);

/** The intrinsic value, with the bit that its rounding would take: floor(apriori / 2) + systematic. The signal
 * `intrinsic` of traces is its half, rounded down; the branch metric unit and the extrinsic unit take all of it.
 *
 * @param apriori            the other decoder's extrinsic value; 0 in the tail
 * @param systematic         systematic soft value
 * @param twice_intrinsic    receives twice the intrinsic value
 * @return                   a status
 */
MORVIK_UNITS_API int32_t morvik_unit_intrinsic(int32_t apriori, int32_t systematic, int32_t* twice_intrinsic);

/** The branch metric unit: twice the intrinsic value plus parity for g0 and g3, minus parity for g1 and g2; each sum is
 * clipped to -128 ... 127.
 *
 * @param twice_intrinsic    twice the intrinsic value
 * @param parity             parity soft value
 * @param g                  receives four branch metrics
 * @return                   a status
 */
MORVIK_UNITS_API int32_t morvik_unit_branch(int32_t twice_intrinsic, int32_t parity, int32_t* g);

/** A step of the forward recursion: for each state the greater of two sums, which wrap at 12 bits, as their differences
 * do.
 *
 * @param algorithm       0 max-log, 1 scaled, 2 table
 * @param alpha           eight forward metrics before the step
 * @param pending         eight corrections pending with them; null stands for zeros
 * @param g               four branch metrics of the step
 * @param next            receives the eight metrics behind the step
 * @param next_pending    receives their pending corrections, unless it is null
 * @return                a status
 */
MORVIK_UNITS_API int32_t morvik_unit_forward(int32_t algorithm,
                                             const int32_t* alpha,
                                             const int32_t* pending,
                                             const int32_t* g,
                                             int32_t* next,
                                             int32_t* next_pending);

/** A step of the backward recursion, likewise.
 *
 * @param algorithm           0 max-log, 1 scaled, 2 table
 * @param beta                eight backward metrics behind the step
 * @param pending             eight corrections pending with them; null stands for zeros
 * @param g                   four branch metrics of the step
 * @param previous            receives the eight metrics before the step
 * @param previous_pending    receives their pending corrections, unless it is null
 * @return                    a status
 */
MORVIK_UNITS_API int32_t morvik_unit_backward(int32_t algorithm,
                                              const int32_t* beta,
                                              const int32_t* pending,
                                              const int32_t* g,
                                              int32_t* previous,
                                              int32_t* previous_pending);

/** The log-likelihood ratio of a step: the best branch with bit 1 minus the best one with bit 0, by a tree of
 * decisions. It wraps at 12 bits.
 *
 * @param algorithm    0 max-log, 1 scaled, 2 table
 * @param alpha        eight forward metrics before the step; corrections pending with them do not count
 * @param beta         eight backward metrics behind the step, likewise
 * @param g            four branch metrics of the step
 * @param ratio        receives the ratio
 * @return             a status
 */
MORVIK_UNITS_API int32_t
morvik_unit_ratio(int32_t algorithm, const int32_t* alpha, const int32_t* beta, const int32_t* g, int32_t* ratio);

/** The extrinsic unit: ratio - 2 * twice_intrinsic, with algorithm 1 times 0.75 and rounded down, clipped to
 * -128 ... 127.
 *
 * @param algorithm          0 max-log, 1 scaled, 2 table
 * @param ratio              log-likelihood ratio
 * @param twice_intrinsic    twice the intrinsic value of the step
 * @param extrinsic          receives the extrinsic value
 * @return                   a status
 */
MORVIK_UNITS_API int32_t morvik_unit_extrinsic(int32_t algorithm,
                                               int32_t ratio,
                                               int32_t twice_intrinsic,
                                               int32_t* extrinsic);

/** The interleaver's address: where a step of the interleaved code finds its values in natural order, (f1 i + f2 i^2)
 * mod K of 3GPP TS 36.212, 5.1.3.2.3. Its cost grows with the step.
 *
 * @param block_size    K
 * @param step          i, 0 to K - 1
 * @param address       receives the address, 0 to K - 1
 * @return              a status
 */
MORVIK_UNITS_API int32_t morvik_unit_address(int32_t block_size, int32_t step, int32_t* address);

/** The tail's column: the backward metrics at step K, where the backward recursion of the last window starts. The
 * branch sums of the tail are not clipped. Seven low bits of the 16-bit word are cleared, the three lowest of a
 * register.
 *
 * @param systematic    three systematic soft values of the tail, of the constituent code that is decoded
 * @param parity        three parity soft values
 * @param beta          receives eight backward metrics
 * @return              a status
 */
MORVIK_UNITS_API int32_t morvik_unit_tail(const int32_t* systematic, const int32_t* parity, int32_t* beta);

/** A column as it is kept at a border between segments or windows: the three lowest bits of each metric are cleared.
 *
 * @param column    eight metrics; corrections pending with them are lost
 * @param border    receives eight metrics
 * @return          a status
 */
MORVIK_UNITS_API int32_t morvik_unit_border(const int32_t* column, int32_t* border);

#ifdef __cplusplus
} /* extern "C" */
#endif

#endif
