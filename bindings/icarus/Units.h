// Units: the units of the core as system functions of Verilog.
#ifndef MORVIK_BINDINGS_ICARUS_UNITS_H
#define MORVIK_BINDINGS_ICARUS_UNITS_H

namespace morvik::icarus {

/// Tells the simulator of $morvik_unit_intrinsic and the others.
void announceUnits();

}  // namespace morvik::icarus

#endif
