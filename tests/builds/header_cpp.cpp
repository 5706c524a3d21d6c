// The public headers alone, as C++.
#include "morvik_checker.h"
#include "morvik_link.h"
#include "morvik_units.h"
#include "morvik_v1_0_version.h"

extern veltra_ip_morvik_v1_0_state* headerState;
