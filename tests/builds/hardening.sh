#!/usr/bin/env bash
# Checks what is shipped, as the linker has left it: filled in before anything runs and read-only then, buffers guarded,
# a library's own functions its own, no library looked for in the current folder, and no folder of the build known.
#   hardening.sh SOURCE BUILD FILE...
set -euo pipefail
source=$1 build=$2
shift 2
faults=0
fault() {
    echo "$file $*" >&2
    faults=1
}

for file in "$@"; do
    dynamic=$(readelf -dW "$file")
    type=$(readelf -hW "$file" | sed -n 's/^ *Type: *\([A-Z]*\).*/\1/p')
    [ "$type" = DYN ] || fault "is of type $type: neither a library nor a position-independent program"
    grep -q GNU_RELRO <<<"$(readelf -lW "$file")" || fault "has no GNU_RELRO"
    grep -q -E 'BIND_NOW|Flags:.* NOW' <<<"$dynamic" || fault "is not bound at start"
    grep -q __stack_chk_fail <<<"$(readelf --dyn-syms -W "$file")" || fault "has no stack protector"
    if ! grep -q -E 'Flags:.* PIE' <<<"$dynamic"; then
        grep -q SYMBOLIC <<<"$dynamic" || fault "lets others take the place of its own functions"
    fi
    path=$(sed -n -E 's/.*\((RPATH|RUNPATH)\).*\[(.*)\]$/\2/p' <<<"$dynamic")
    case ":$path:" in
    ::) ;; # none
    *::*) fault "looks for libraries in the current folder: '$path'" ;;
    esac
    if grep -q -a -F -e "$source/" -e "$build" "$file"; then
        fault "knows where it was built"
    fi
done
exit $faults
