#!/usr/bin/env bash
# Unpacks an archive of scripts/archives and uses it as someone does who has nothing else: the command in an empty system,
# programs by pkg-config and by CMake, the sources of bindings.
#   use.sh ARCHIVE
set -euo pipefail
archive=$(realpath "$1")
here=$(cd "$(dirname "$0")" && pwd)
folder=$(mktemp -d)
trap 'rm -rf "$folder"' EXIT
cd "$folder"
fail() {
    echo "$*" >&2
    exit 1
}

# How programs of the system are compiled and run here.
case $archive in
    *-linux-x86_64.*) flags=-m64 compilers=(cc c++) emulator=() ;;
    *-linux-i386.*) flags=-m32 compilers=(cc c++) emulator=() ;;
    *-linux-aarch64.*)
        flags='' compilers=(aarch64-linux-gnu-gcc aarch64-linux-gnu-g++)
        emulator=(qemu-aarch64-static -L /usr/aarch64-linux-gnu) ;;
    *-windows-x86_64.*) exec "$here/use_windows.sh" "$archive" ;;
    *) fail "$archive is for no system that is known here" ;;
esac
export CC=${compilers[0]} CXX=${compilers[1]} CFLAGS=$flags CXXFLAGS=$flags

gzip --decompress --stdout "$archive" | tar --extract  # a bare Debian has no xz
prefix="$folder/moved here"
mv morvik-*-linux-* "$prefix"
cd "$prefix"

echo "The files"
sha256sum --quiet --check MANIFEST.sha256
diff <(find . -type f ! -name MANIFEST.sha256 -printf '%P\n' | sort) <(sed 's/^[^ ]*  //' MANIFEST.sha256 | sort) ||
    fail "The manifest has other files"
python3 -B "$here/materials.py" . libstdc++ libgcc glibc CLI11 nlohmann-json Boost Random123
libraries=(lib/*.so)
[ ${#libraries[@]} -eq 5 ] || fail "There are ${#libraries[@]} libraries: ${libraries[*]}"
python3 -B "$here/symbols.py" "${libraries[@]}"
if grep -rlF -e "$(realpath "$here/../..")" -e "$folder" .; then
    fail "These files know where they were built"
fi
empty=$(find . -type d -empty)
[ -z "$empty" ] || fail "These folders are empty: $empty"
named=$(grep -ohE 'tests/data/vectors/k[0-9]+\.(csv|bits)' share/doc/morvik/docs/*.md | sort -u)
for file in $named; do
    [ -s "share/morvik/${file#tests/data/}" ] || fail "The pages need $file"
done
for file in man/man1/morvik-decode.1 bash-completion/completions/morvik zsh/site-functions/_morvik doc/morvik/LICENSE \
    doc/morvik/docs/tools.md doc/morvik/docs/trace.gtkw morvik/systemverilog/decoder_env_pkg.sv; do
    [ -s "share/$file" ] || fail "There is no share/$file"
done

# The command alone in a system without a single other file but the blocks: no library, no /proc, no folder for
# temporary files.
echo "The command"
root=$folder/root
mkdir "$root"
cp bin/morvik share/morvik/vectors/* "$root"
inside=(unshare --map-root-user --root="$root")
[ "$(id -u)" -ne 0 ] || inside=(chroot "$root")
if [ ${#emulator[@]} -gt 0 ]; then
    cp "$(command -v "${emulator[0]}")" "$root/emulator"
    inside+=(/emulator)
fi
morvik() {
    "${inside[@]}" /morvik "$@"
}
morvik decode k512.csv --reference k512.bits --output decoded 2>&1 | grep '0 bit errors, 0 block errors'
cmp "$root/decoded" share/morvik/vectors/k512.bits
morvik trace k40.csv --half-iterations 0:1 --format vcd --output k40.vcd
grep -q enddefinitions "$root/k40.vcd"
morvik ber --block-size 40 --ebn0 1:1:2 --max-blocks 500 --threads 2 --seed 1 --output rates.csv --report rates.html --quiet
[ "$(wc -l <"$root/rates.csv")" -eq 3 ] || fail "There is no curve"
grep -q '</html>' "$root/rates.html"
morvik vectors --out stimulus --block-size 40 --blocks 1 >"$folder/log"
morvik decode nothing.csv >"$folder/log" 2>&1 && fail "A missing file is no mistake"
grep -q nothing.csv "$folder/log"

echo "Programs by pkg-config"
mkdir "$folder/make"
cp -r share/morvik/examples "$folder"  # make cannot stand the blank in the folder's name
if [ ${#emulator[@]} -eq 0 ]; then
    make=(make --silent -C "$folder/examples" check)
else
    make=(make --silent -C "$folder/examples" all)
fi
PKG_CONFIG_PATH="$prefix/lib/pkgconfig" OUT="$folder/make" "${make[@]}" 2>"$folder/log" || { cat "$folder/log"; fail "make fails"; }
echo "Programs by CMake"
cmake -S share/morvik/examples -B "$folder/cmake" -DCMAKE_PREFIX_PATH="$prefix" >"$folder/log"
cmake --build "$folder/cmake" --target decode >"$folder/log"
LD_LIBRARY_PATH="$prefix/lib" "${emulator[@]}" "$folder/cmake/decode" 2>"$folder/log" | diff - share/morvik/examples/decode.expected

# Libraries for simulators, from their sources; nothing may be missing when they are loaded.
echo "Sources of bindings"
source=share/morvik/source
compile() {
    # shellcheck disable=SC2086
    "$CXX" $flags -std=c++17 -fPIC -Wall -Wextra -Werror -I$source -Iinclude -Iinclude/morvik_v1_0_classes "$@"
}
for binding in systemverilog/morvik_dpi vhdl/morvik_vhdl; do
    compile -shared "$source/bindings/$binding.cpp" $source/bindings/simulator/*.cpp $source/hardware/*/*.cpp \
        -Llib -lmorvik_checker -lmorvik_v1_0_bitacc_cmodel -Wl,-z,defs -o "$folder/lib${binding#*/}.so"
done
if [ "$flags" = -m64 ]; then
    LD_LIBRARY_PATH=lib python3 -c "
import ctypes, sys
compiled = ctypes.CDLL(sys.argv[1])
compiled.morvik_dpi_create.restype = ctypes.c_void_p
decoder = ctypes.c_void_p(compiled.morvik_dpi_create(2, 1, 8))
for position in range(44):
    compiled.morvik_dpi_put(decoder, -24, -24, -24)
assert compiled.morvik_dpi_decode(decoder, 8, 5) == 0 and compiled.morvik_dpi_size(decoder) == 40" "$folder/libmorvik_dpi.so"
fi
# The one of the archive, in a host in C.
# shellcheck disable=SC2086
"$CC" $flags -std=c99 "$here/host.c" -o "$folder/host" -ldl -pthread
"${emulator[@]}" "$folder/host" lib/libmorvik_dpi.so
if [ "$flags" = -m64 ] && command -v mkoctfile >/dev/null; then
    functions=$source/bindings/octave
    make_function() {
        CXXFLAGS="-O1 -std=c++17" mkoctfile --mex -I$source -Iinclude -Iinclude/morvik_v1_0_classes -Llib \
            --output "$functions/private/$1.mex" "$functions/$1.cpp" "${@:2}"
    }
    make_function morvik_mex $source/link/coding/TurboEncoder.cpp -lmorvik_v1_0_bitacc_cmodel
    make_function morvik_unit_mex -lmorvik_checker
    LD_LIBRARY_PATH=lib octave-cli --no-history --norc --path "$functions" --eval "
        bits = rand(40, 3) < 0.5;
        [a, b, c] = morvik_encode(bits);
        assert(isequal(morvik_decode(16 * (2 * a - 1), 16 * (2 * b - 1), 16 * (2 * c - 1)), bits));
        assert(morvik_unit_address(40, 7), int16(31));"
fi
if [ -e /usr/include/iverilog/vpi_user.h ]; then
    compile -I/usr/include/iverilog -c $source/bindings/icarus/morvik_vpi.cpp -o "$folder/vpi.o"
fi
echo "Everything works"
