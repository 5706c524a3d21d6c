#!/usr/bin/env bash
# Compiles the digest and the whole model with one compiler, for one word size, at one level of optimisation.
#   build_digest.sh COMPILER WORD LEVEL PROGRAM        build_digest.sh g++ -m32 -O0 build/digest
set -euo pipefail
program=$4
tests=$(cd "$(dirname "$0")/.." && pwd)
root=$(dirname "$tests")
compile=("$1" -std=c++17 "$2" -msse2 -mfpmath=sse "$3" -I"$root" -I"$root/include" -I"$root/src" -I"$tests")
work=$(mktemp -d)
trap 'rm -rf "$work"' EXIT

"${compile[@]}" -DMORVIK_LANES=generic -DMORVIK_LANES_NAME='"generic"' -c "$root/lanes/Kernels.cpp" -o "$work/kernels.o"
# Several sources at a time: the headers take longer than what stands below them.
sources=("$root"/src/*.cpp)
IFS=';' read -ra units < <("$root/scripts/join-sources" "${sources[@]}")
for i in "${!sources[@]}"; do
    echo "#include \"${sources[i]}\"" >>"$work/unit_${units[i]}.cpp"
done
"${compile[@]}" -DMORVIK_LANES_ONLY_GENERIC -DMORVIK_VERSION='""' "$work"/unit_*.cpp \
    "$root/lanes/InstructionSets.cpp" "$root/lanes/LaneDecoder.cpp" "$root/lanes/SizeTables.cpp" \
    "$tests/support/Blocks.cpp" "$tests/builds/digest.cpp" "$work/kernels.o" -o "$program"
