#!/usr/bin/env bash
# Checks the C++ runtime that a library needs: symbols of version LATEST, and no later one; or with the word none,
# neither libstdc++ nor libgcc_s at all.
#   runtime.sh LIBRARY LATEST|none
set -euo pipefail
library=$1
expected=$2
needed=$(readelf --dynamic --wide "$library" | sed -n 's/.*(NEEDED).*\[\(.*\)\]/\1/p')
latest=$(readelf --version-info --wide "$library" | grep -o 'GLIBCXX_[0-9.]*' | sort -V | tail -n 1) || latest=none
echo "needs $(tr '\n' ' ' <<<"$needed"), latest version: $latest"
if [ "$expected" = none ] && grep -E 'libstdc\+\+|libgcc_s' <<<"$needed"; then
    exit 1
fi
[ "$latest" = "$expected" ]
