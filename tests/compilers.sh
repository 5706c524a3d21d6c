#!/usr/bin/env bash
# Builds the model and the digest with g++ and clang++, for both word sizes, without and with
# optimisation, and compares the eight digests with the expected one.
#   compilers.sh SOURCE_DIR EXPECTED_DIGEST
set -eu
source_dir=$1
expected=$2
work=$(mktemp -d)
trap 'rm -rf "$work"' EXIT
status=0
for compiler in g++ clang++; do
    for word in -m64 -m32; do
        for level in -O0 -O3; do
            "$compiler" -std=c++17 $word -msse2 -mfpmath=sse $level \
                -I"$source_dir/include" -I"$source_dir/src" -I"$source_dir/tests" \
                "$source_dir"/src/*.cpp "$source_dir/tests/support/Blocks.cpp" "$source_dir/tests/digest.cpp" \
                -o "$work/digest"
            got=$("$work/digest")
            echo "$compiler $word $level: $got"
            [ "$got" = "$expected" ] || status=1
        done
    done
done
[ $status -eq 0 ] || echo "expected $expected from each"
exit $status
