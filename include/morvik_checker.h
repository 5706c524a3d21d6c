/** @file
 * A checker in lockstep with the simulation of a core, for C (C99) and C++: a test bench hands it values as they
 * appear, and it answers at once whether they are the core's. The library libmorvik_checker has these functions; it
 * needs no other one of morvik's. Those of the simulators' bindings are thin layers over them.
 *
 * A checker is given a configuration and then one block after the other. It computes every value of a block when the
 * block starts, so each of them can be asked for as well.
 *
 * @par Example: a block of K = 40 whose ratios are observed
 *
 *     static int sys[44], par1[44], par2[44];                               // K + 4 soft values each: fill them in
 *     int half_iteration = 0, step = 0, llr = 0;                            // from the simulation
 *     morvik_checker* checker = morvik_checker_create(2, 1);                // two units, scaled
 *     for (int i = 0; i < 44; ++i)
 *         morvik_checker_put(checker, sys[i], par1[i], par2[i]);
 *     morvik_checker_start(checker, 8);                                     // eight iterations
 *     if (morvik_checker_observe(checker, MORVIK_CHECKER_LLR, half_iteration, step, llr) != MORVIK_CHECKER_AGREES)
 *         for (const char* text = morvik_checker_message(checker); *text; text = morvik_checker_message(checker))
 *             fprintf(stderr, "%s\n", text);
 *     puts(morvik_checker_report(checker));
 *     int status = morvik_checker_standing(checker);
 *     morvik_checker_destroy(checker);
 *
 * @par Places and values
 *   A value has a signal, a half-iteration and a trellis step, all counted from 0. Half-iteration 0 decodes the
 *   interleaved code, and steps count in the order of the code that is decoded. All values are integers in eighths, as
 *   the core's registers hold them in two's complement, -2048 to 2047.
 *
 * @par Messages
 *   What a checker has to say is queued: the first difference, why a call was refused, and warnings about soft values.
 *   Nothing is printed, and no C++ exception gets out.
 *
 * @par Threads
 *   Checkers are independent. One checker may not be used by two threads at once.
 */
#ifndef MORVIK_CHECKER_H
#define MORVIK_CHECKER_H

#include <stdint.h>

/** Marks what the library exports; on Windows a .def file lists it. */
#if defined(__GNUC__) && !defined(_WIN32)
#define MORVIK_CHECKER_API __attribute__((visibility("default")))
#else
#define MORVIK_CHECKER_API
#endif

#ifdef __cplusplus
extern "C" {
#endif

/** The numbers of the signals. The first number of a group stands for its row as well: MORVIK_CHECKER_ALPHA + 3 is
 * alpha3. */
enum {
    MORVIK_CHECKER_INTRINSIC = 0,
    MORVIK_CHECKER_G = 1,     /**< branch metrics g0 to g3          */
    MORVIK_CHECKER_ALPHA = 5, /**< forward metrics alpha0 to alpha7 */
    MORVIK_CHECKER_BETA = 13, /**< backward metrics beta0 to beta7  */
    MORVIK_CHECKER_LLR = 21,  /**< log-likelihood ratio             */
    MORVIK_CHECKER_EXTRINSIC = 22,
    MORVIK_CHECKER_SIGNALS = 23 /**< how many there are               */
};

/** What functions answer. */
enum {
    MORVIK_CHECKER_AGREES = 0,
    MORVIK_CHECKER_DIFFERS = 1,
    MORVIK_CHECKER_REFUSED = 2,    /**< the call was wrong; a message says why                           */
    MORVIK_CHECKER_INCOMPLETE = 3, /**< nothing differs, but values are missing                          */
    MORVIK_CHECKER_OUT_OF_MEMORY = 99
};

/** The value of a signal with bits that are x or z. Also what morvik_checker_value returns where there is no value. */
#define MORVIK_CHECKER_UNKNOWN INT32_MIN

/** A checker. Every function takes a null pointer for one that is not open. */
typedef struct morvik_checker morvik_checker;

/** Makes a checker.
 *
 * @param num_pu       processing units: 2, 4 or 8
 * @param algorithm    0 max-log, 1 scaled, 2 table
 * @return             a checker that the caller releases, or null if memory is exhausted. If the configuration is
 *                     refused, it is not open, and a message says why
 */
MORVIK_CHECKER_API morvik_checker* morvik_checker_create(int32_t num_pu, int32_t algorithm);

/** Releases a checker.
 *
 * @param checker    a checker; a null pointer is ignored
 */
MORVIK_CHECKER_API void morvik_checker_destroy(morvik_checker* checker);

/** Whether a configuration was accepted.
 *
 * @param checker    a checker
 * @return           1 if it was, else 0
 */
MORVIK_CHECKER_API int32_t morvik_checker_is_open(const morvik_checker* checker);

/** Appends a position to the next block.
 *
 * @param checker    a checker
 * @param sys        systematic soft value, as morvik_v1_0_bitacc_cmodel.h takes it
 * @param par1       soft value of the first encoder's parity
 * @param par2       soft value of the second encoder's parity
 */
MORVIK_CHECKER_API void morvik_checker_put(morvik_checker* checker, int32_t sys, int32_t par1, int32_t par2);

/** Begins a block: the positions put since the last call, K + 4, which are forgotten. What has been observed of the
 * block before is forgotten as well.
 *
 * @param checker       a checker
 * @param iterations    full turbo iterations, 1 to 15
 * @return              MORVIK_CHECKER_AGREES; or MORVIK_CHECKER_REFUSED or MORVIK_CHECKER_OUT_OF_MEMORY, after which
 *                      there is no block
 */
MORVIK_CHECKER_API int32_t morvik_checker_start(morvik_checker* checker, int32_t iterations);

/** Ends the block, as morvik_checker_start does when it refuses the next one: for an environment that refuses a block
 * itself. What has been put and observed is forgotten.
 *
 * @param checker    a checker
 */
MORVIK_CHECKER_API void morvik_checker_forget(morvik_checker* checker);

/** The number of a signal.
 *
 * @param name    "intrinsic", "g0" to "g3", "alpha0" to "alpha7", "beta0" to "beta7", "llr", "extrinsic"; "g", "alpha"
 *                and "beta" are the first of their rows
 * @return        its number, or -1 if there is none of this name
 */
MORVIK_CHECKER_API int32_t morvik_checker_signal(const char* name);

/** Takes a value of the simulation. Where the core computes nothing, such as ratios in the tail, nothing is compared.
 * A place may be observed again. The first difference of a block is queued as a message of several lines; later ones
 * are counted.
 *
 * @param checker           a checker with a block
 * @param signal            its number
 * @param half_iteration    0 to 2 * iterations - 1
 * @param step              0 to K + 2
 * @param value             -2048 to 2047, or MORVIK_CHECKER_UNKNOWN
 * @return                  MORVIK_CHECKER_AGREES, MORVIK_CHECKER_DIFFERS, MORVIK_CHECKER_REFUSED or
 *                          MORVIK_CHECKER_OUT_OF_MEMORY
 */
MORVIK_CHECKER_API int32_t
morvik_checker_observe(morvik_checker* checker, int32_t signal, int32_t half_iteration, int32_t step, int32_t value);

/** Takes a whole row: all four branch metrics, or all eight forward or backward metrics of a step. The message about a
 * difference then knows all of them.
 *
 * @param checker           a checker with a block
 * @param signal            MORVIK_CHECKER_G, MORVIK_CHECKER_ALPHA or MORVIK_CHECKER_BETA; another signal has one value
 * @param half_iteration    0 to 2 * iterations - 1
 * @param step              0 to K + 2
 * @param values            as many values as the row has, each as above
 * @return                  as above; MORVIK_CHECKER_REFUSED if a value is refused, and then none is taken
 */
MORVIK_CHECKER_API int32_t morvik_checker_observe_row(
    morvik_checker* checker, int32_t signal, int32_t half_iteration, int32_t step, const int32_t* values);

/** A value that the core computes on the block.
 *
 * @param checker           a checker with a block
 * @param signal            its number
 * @param half_iteration    0 to 2 * iterations - 1
 * @param step              0 to K + 2
 * @return                  the value, or MORVIK_CHECKER_UNKNOWN where the core computes none, and, after a message, if
 *                          there is no such place
 */
MORVIK_CHECKER_API int32_t morvik_checker_value(morvik_checker* checker,
                                                int32_t signal,
                                                int32_t half_iteration,
                                                int32_t step);

/** The log-likelihood ratio of a bit after the last half-iteration; a ratio of 0 or more decides for 1.
 *
 * @param checker    a checker with a block
 * @param bit        0 to K - 1
 * @return           as morvik_checker_value
 */
MORVIK_CHECKER_API int32_t morvik_checker_ratio(morvik_checker* checker, int32_t bit);

/** How many values of a signal have been observed at least once.
 *
 * @param checker    a checker
 * @param signal     its number
 * @return           the count, 0 without a block and for no number of a signal
 */
MORVIK_CHECKER_API int32_t morvik_checker_seen(const morvik_checker* checker, int32_t signal);

/** How many values of a signal the core computes on the block.
 *
 * @param checker    a checker
 * @param signal     its number
 * @return           the count, 0 without a block and for no number of a signal
 */
MORVIK_CHECKER_API int32_t morvik_checker_expected(const morvik_checker* checker, int32_t signal);

/** How many of the observed values differ.
 *
 * @param checker    a checker
 * @return           the count for this block
 */
MORVIK_CHECKER_API int32_t morvik_checker_differences(const morvik_checker* checker);

/** How the block stands.
 *
 * @param checker    a checker
 * @return           MORVIK_CHECKER_AGREES if at least one signal and all values of each observed signal have been
 *                   observed and agree; MORVIK_CHECKER_DIFFERS; MORVIK_CHECKER_INCOMPLETE;
 *                   MORVIK_CHECKER_REFUSED without a block
 */
MORVIK_CHECKER_API int32_t morvik_checker_standing(const morvik_checker* checker);

/** Describes how much of the block has been observed, and all differences, as `morvik compare` does.
 *
 * @param checker    a checker
 * @return           lines, separated by line feeds, valid until the next call with this checker; an empty text without
 *                   a block, after a message. If situations are counted, the last line is a summary of them
 */
MORVIK_CHECKER_API const char* morvik_checker_report(morvik_checker* checker);

/** Counts situations of the arithmetic from now on: clips, wraps, ties, borders and others at values that have been
 * observed and agree, of this block, from its start, and of all that follow. Another call changes nothing. Counting
 * takes longer than observing.
 *
 * @param checker    a checker
 * @return           MORVIK_CHECKER_AGREES; or MORVIK_CHECKER_REFUSED after a message if the configuration was refused,
 *                   or MORVIK_CHECKER_OUT_OF_MEMORY
 */
MORVIK_CHECKER_API int32_t morvik_checker_count_situations(morvik_checker* checker);

/** The situations that have been counted since morvik_checker_count_situations. `morvik coverage` reads such counts,
 * and sums those of several simulations.
 *
 * @param checker    a checker
 * @return           a CSV file of lines separated by line feeds, valid until the next call with this checker; an empty
 *                   text after a message if they are not counted
 */
MORVIK_CHECKER_API const char* morvik_checker_situations(morvik_checker* checker);

/** Writes them to a file, which appears complete or not at all.
 *
 * @param checker    a checker
 * @param file       its name; it is replaced
 * @return           MORVIK_CHECKER_AGREES; or MORVIK_CHECKER_REFUSED after a message, such as if they are not counted,
 *                   or MORVIK_CHECKER_OUT_OF_MEMORY
 */
MORVIK_CHECKER_API int32_t morvik_checker_write_situations(morvik_checker* checker, const char* file);

/** Takes the oldest message from the queue.
 *
 * @param checker    a checker
 * @return           a text that begins with "ERROR:" or "WARNING:", of several lines for a difference, or an empty one
 *                   if there is none; valid until the next call with this checker
 */
MORVIK_CHECKER_API const char* morvik_checker_message(morvik_checker* checker);

#ifdef __cplusplus
} /* extern "C" */
#endif

#endif
