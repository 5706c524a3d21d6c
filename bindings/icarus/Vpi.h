// Vpi: values, arguments and messages of a simulator with VPI.
#ifndef MORVIK_BINDINGS_ICARUS_VPI_H
#define MORVIK_BINDINGS_ICARUS_VPI_H

#include <sv_vpi_user.h>
#include <vpi_user.h>

#include <stdexcept>
#include <string>
#include <vector>

namespace morvik::icarus {

/// An error in the arguments of a call.
struct Mistake : std::runtime_error {
    using std::runtime_error::runtime_error;
};

/// The interface takes non-const strings, but does not change them.
char* text(const char* constant);

/// Writes a line to the log, in the format of the simulator's own errors.
void report(const char* severity, const std::string& line);

/// Tells of a wrong call while the design is compiled, and ends the simulation.
void failCompilation(const std::string& line);

std::vector<vpiHandle> argumentsOf(vpiHandle call);

/// A value, sign-extended if `isSigned` and narrower than 32 bits. Throws Mistake for a wider one that does not fit
/// into 32 bits, and for bits that are x or z.
int valueOf(vpiHandle object, bool isSigned, const std::string& name);

/// A value as it is declared. Throws Mistake likewise.
int argument(vpiHandle object, const std::string& name);

void setValue(vpiHandle object, int integer);

bool isConstant(vpiHandle object);
bool isString(vpiHandle object);
bool isArray(vpiHandle object);

/// Reals and strings have no bits to ask for.
bool isInteger(vpiHandle object);

}  // namespace morvik::icarus

#endif
