#!/usr/bin/env bash
# Compares what a library exports with a list, one demangled symbol to a line; tells the difference.
#   exports.sh LIBRARY LIST [--renew]
set -eu
library=$1
list=$2
exported=$(nm -D --defined-only "$library" | awk '{print $3}' | c++filt | LC_ALL=C sort -u)
if [ "${3:-}" = --renew ]; then
    echo "$exported" > "$list"
fi
diff -u "$list" <(echo "$exported")
