#!/usr/bin/env bash
# Checks that what a compilation for an instruction set offers to the linker is all of its own namespace.
# A shared inline function, compiled with that set's instructions, could be the one that the linker keeps for
# everybody, and that a machine without them would run.
#   lane_objects.sh NAMESPACE OBJECT...
set -eu
namespace=$1
shift
symbols=$(nm -C --defined-only --extern-only "$@")
if ! grep -q -F " $namespace::" <<<"$symbols"; then
    echo "$namespace:: has no symbols" >&2
    exit 1
fi
# Templates of other namespaces over the compilation's own types are its own, too. With 32 bits, the compiler adds
# functions that tell where they were called from: they are alike for every instruction set.
foreign=$(sed -n -E 's/^[0-9a-f]+ [A-Za-z] //p' <<<"$symbols" | grep -v -E "\\b$namespace::|^__x86\\.get_pc_thunk\\." || true)
if [ -n "$foreign" ]; then
    printf '%s offers what is not of its own:\n%s\n' "$namespace" "$foreign" >&2
    exit 1
fi
