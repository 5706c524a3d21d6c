/** @file
 * The version of the morvik library that is loaded, which need not be the one that a program was built with.
 */
#ifndef MORVIK_V1_0_VERSION_H
#define MORVIK_V1_0_VERSION_H

#include "morvik_v1_0_bitacc_cmodel.h"

#ifdef __cplusplus
extern "C" {
#endif

/** @return the version as text, such as "1.0.0": major, minor and patch. It is the library's and lives as long as that
 * is loaded. Libraries of one major version take each other's place (they share the SONAME); a minor version adds
 * functions.
 */
MORVIK_API const char* veltra_ip_morvik_v1_0_version(void);

#ifdef __cplusplus
}
#endif

#endif
