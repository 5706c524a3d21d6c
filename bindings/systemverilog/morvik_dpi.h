/* The C functions that morvik_pkg.sv imports, besides those of morvik_checker.h, which the library has as well. They
 * need nothing of a simulator: scalars, handles and texts are the same in C for every one, and no arrays are passed, on
 * which they disagree.
 *
 * A decoder is null after a failure to allocate it alone; generics that are refused leave one that is not open, whose
 * message tells why. Every function takes a null decoder, and does nothing with it.
 */
#ifndef MORVIK_BINDINGS_SYSTEMVERILOG_MORVIK_DPI_H
#define MORVIK_BINDINGS_SYSTEMVERILOG_MORVIK_DPI_H

#include "morvik_v1_0_bitacc_cmodel.h"

#ifdef __cplusplus
extern "C" {
#endif

MORVIK_API void* morvik_dpi_create(int num_pu, int algorithm, int tag_width);
MORVIK_API void morvik_dpi_destroy(void* decoder);

/* 1 when its generics were accepted, else 0. */
MORVIK_API int morvik_dpi_is_open(void* decoder);

/* Appends a position to the next block. */
MORVIK_API void morvik_dpi_put(void* decoder, int sys, int par1, int par2);

/* Decodes the positions that were put since the last call, K + 4, and forgets them. Returns the status of
 * veltra_ip_morvik_v1_0_bitacc_simulate, 0 when decoded. */
MORVIK_API int morvik_dpi_decode(void* decoder, int iterations, unsigned int tag);

/* What the last decode gave: the number of decisions, one of them, and the tag. */
MORVIK_API int morvik_dpi_size(void* decoder);
MORVIK_API int morvik_dpi_bit(void* decoder, int position);
MORVIK_API unsigned int morvik_dpi_tag(void* decoder);

/* Takes the oldest message, a line that begins with "ERROR:" or "WARNING:", or "" when there is none. */
MORVIK_API const char* morvik_dpi_message(void* decoder);

/* morvik_checker_observe_row with scalars: the last four values of a row of four do not matter. */
MORVIK_API int morvik_dpi_observe_row(void* checker,
                                      int signal,
                                      int half_iteration,
                                      int step,
                                      int value0,
                                      int value1,
                                      int value2,
                                      int value3,
                                      int value4,
                                      int value5,
                                      int value6,
                                      int value7);

/* The units of the core: inputs one after the other, then the number of the unit, then its results. */

/* Appends an input of the next call. */
MORVIK_API void morvik_dpi_unit_put(int value);

/* Computes, and forgets the inputs. Returns the number of results, 0 if something was refused. */
MORVIK_API int morvik_dpi_unit_compute(int unit, int algorithm);

/* A result of the last call. */
MORVIK_API int morvik_dpi_unit_result(int number);

/* Why the last call was refused, a line that begins with "ERROR:", or "". */
MORVIK_API const char* morvik_dpi_unit_message(void);

#ifdef __cplusplus
}
#endif

#endif
