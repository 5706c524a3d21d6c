#!/usr/bin/env bash
# What use.sh does, for Windows: the programs run in Wine.
#   use_windows.sh ARCHIVE
set -euo pipefail
archive=$(realpath "$1")
here=$(cd "$(dirname "$0")" && pwd)
folder=$(mktemp -d)
trap 'WINEPREFIX="$folder/wine" wineserver -k 2>/dev/null || true; rm -rf "$folder"' EXIT
cd "$folder"
fail() {
    echo "$*" >&2
    exit 1
}
export WINEPREFIX=$folder/wine WINEDEBUG=-all LC_ALL=C.UTF-8
unset DISPLAY
machine=x86_64-w64-mingw32

unzip -q "$archive"
mv morvik-*-windows-* "moved here"
cd "moved here"

echo "The files"
sha256sum --quiet --check MANIFEST.sha256
python3 -B "$here/materials.py" . libstdc++ libgcc mingw-w64 CLI11 nlohmann-json Boost Random123
needed=$(for file in bin/*; do $machine-objdump -p "$file"; done | sed -n 's/.*DLL Name: //p' | sort -u)
echo "needs" $needed
if grep -viE '^(kernel32|msvcrt|advapi32|user32|shell32|ole32|bcrypt|ntdll)\.dll$' <<<"$needed"; then
    fail "These come with no Windows"
fi
if grep -rlF -e "$(realpath "$here/../..")" .; then
    fail "These files know where they were built"
fi

echo "The command"
morvik() {
    wine bin/morvik.exe "$@" 2>&1 | tr -d '\r'
}
morvik decode share/morvik/vectors/k512.csv --reference share/morvik/vectors/k512.bits --output decoded |
    grep '0 bit errors, 0 block errors'
cmp decoded share/morvik/vectors/k512.bits
morvik trace share/morvik/vectors/k40.csv --half-iterations 0:1 --format vcd --output k40.vcd
grep -q enddefinitions k40.vcd
morvik ber --block-size 40 --ebn0 1:1:2 --max-blocks 500 --threads 2 --seed 1 --output rates.csv --report rates.html --quiet
[ "$(wc -l <rates.csv)" -eq 3 ] || fail "There is no curve"

echo "Programs"
export PKG_CONFIG_PATH="$PWD/lib/pkgconfig"
eval "$machine-gcc-posix" -std=c99 -static-libgcc share/morvik/examples/decode.c \
    "$(pkg-config --cflags --libs morvik_v1_0_bitacc_cmodel)" -o bin/decode.exe
wine bin/decode.exe 2>/dev/null | tr -d '\r' | diff - share/morvik/examples/decode.expected
cmake -S share/morvik/examples -B "$folder/cmake" -DCMAKE_SYSTEM_NAME=Windows -DCMAKE_C_COMPILER=$machine-gcc-posix \
    -DCMAKE_CXX_COMPILER=$machine-g++-posix -DCMAKE_PREFIX_PATH="$PWD" >"$folder/log" || { cat "$folder/log"; fail "cmake fails"; }
cmake --build "$folder/cmake" >"$folder/log" || { cat "$folder/log"; fail "cmake --build fails"; }

echo "Sources of bindings"
source=share/morvik/source
for binding in systemverilog/morvik_dpi vhdl/morvik_vhdl; do
    $machine-g++-posix -std=c++17 -Wall -Wextra -Werror -I$source -Iinclude -Iinclude/morvik_v1_0_classes -shared \
        "$source/bindings/$binding.cpp" $source/bindings/simulator/*.cpp $source/hardware/*/*.cpp \
        -Llib -lmorvik_checker -lmorvik_v1_0_bitacc_cmodel -o "$folder/${binding#*/}.dll"
done
echo "Everything works"
