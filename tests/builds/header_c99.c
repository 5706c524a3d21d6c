/* The public headers alone, as strict C99. */
#include "morvik_checker.h"
#include "morvik_link.h"
#include "morvik_units.h"
#include "morvik_v1_0_version.h"

/* Fourteen words: three pointers and eleven integers, with the padding that the pointers ask for. */
typedef char generics_have_fourteen_words
    [sizeof(veltra_ip_morvik_v1_0_generics) == 3 * sizeof(char*) + 11 * 4 + (sizeof(char*) - 4) ? 1 : -1];

extern veltra_ip_morvik_v1_0_state* header_state;
