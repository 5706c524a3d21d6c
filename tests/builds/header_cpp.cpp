// The public header alone, as C++.
#include "morvik_v1_0_bitacc_cmodel.h"

extern veltra_ip_morvik_v1_0_state* headerState;
