#!/usr/bin/env bash
# The sources of bindings, as an archive has them: every header of ours that they include is there.
#   sources.sh BUILD CMAKE
set -euo pipefail
build=$1 cmake=$2
folder=$(mktemp -d)
trap 'rm -rf "$folder"' EXIT
for component in library checker archive; do
    "$cmake" --install "$build" --prefix "$folder" --component "$component" >/dev/null
done

cd "$folder/share/morvik/source"
mapfile -t sources < <(find . -name '*.cpp')
[ ${#sources[@]} -ge 12 ] || { echo "There are only ${#sources[@]} sources" >&2; exit 1; }
# With -MG, a header that is not found is named as it is included: those of simulators and of Octave may be missing here.
# shellcheck disable=SC2086
missing=$("$CXX" ${CXXFLAGS:-} -std=c++17 -MM -MG -I. -I"$folder/include" -I"$folder/include/morvik_v1_0_classes" "${sources[@]}" |
    grep -oE '[^ \\]+\.h' | sort -u |
    while read -r header; do [ -e "$header" ] || echo "$header"; done | grep -vxE 'vpi_user\.h|mex\.h') || true
if [ -n "$missing" ]; then
    echo "These headers are not in the archive: $missing" >&2
    exit 1
fi
