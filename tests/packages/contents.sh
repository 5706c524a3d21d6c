#!/usr/bin/env bash
# Makes the packages of a build and looks into them: by lintian, by what they depend on, and by use of what they hold,
# unpacked in a folder. `scripts/ci.sh packages` installs them in a system of their own.
#   contents.sh BUILD SOURCE CPACK
# EMULATOR in the environment starts programs of another machine, CC and CXX compile them.
set -euo pipefail
build=$1 source=$2 cpack=$3
folder=$(mktemp -d)
trap 'rm -rf "$folder"' EXIT
fail() {
    echo "$*" >&2
    exit 1
}

"$cpack" --config "$build/CPackConfig.cmake" -B "$folder" >"$folder/log" 2>&1 || { cat "$folder/log"; fail "cpack fails"; }
cd "$folder"

export EMULATOR=${EMULATOR:-}
version=$($EMULATOR "$build/bin/morvik" --version | sed 's/^morvik //')-1
library=libmorvik-v1-0-bitacc-cmodel1 link=libmorvik-link1 checker=libmorvik-checker1 development=libmorvik-v1-0-bitacc-cmodel-dev
case $(file -L "$build/bin/morvik") in
    *aarch64*)
        architecture=arm64
        multiarch=aarch64-linux-gnu
        expected=("$library" "$link" "$checker" "$development" morvik morvik-simulators) ;;
    *32-bit*)
        architecture=i386
        multiarch=i386-linux-gnu
        expected=("$library" "$link" "$checker" "$development" morvik morvik-simulators) ;;
    *)
        architecture=amd64
        multiarch=x86_64-linux-gnu
        expected=("$library" "$link" "$checker" "$development" morvik morvik-mpi morvik-simulators python3-morvik gr-morvik octave-morvik
            morvik-doc) ;;
esac
names=()
for package in *.deb; do
    names+=("$(dpkg-deb --field "$package" Package)")
    [ "$(dpkg-deb --field "$package" Version)" = "$version" ] || fail "$package is not of version $version"
done
diff <(printf '%s\n' "${expected[@]}" | sort) <(printf '%s\n' "${names[@]}" | sort) || fail "These are other packages"

echo "lintian"
lintian --fail-on error,warning ./*.deb 2>&1 || fail "lintian finds faults"

field() {
    dpkg-deb --field "$1_${version}_"*.deb "$2"
}
depends() {
    [[ ", $(field "$1" Depends)," == *", $2"[\ ,]* ]] || fail "$1 does not depend on $2: $(field "$1" Depends)"
}
depends "$library" libstdc++6
depends "$link" libstdc++6
depends "$development" "$library"
depends "$development" "$link"
depends "$development" "$checker"
depends morvik "$library"
[ "$(field "$library" Multi-Arch)$(field "$link" Multi-Arch)" = samesame ] || fail "The libraries of two architectures exclude each other"
foreign='lib[^ ]*32|-cross'
if [[ $(for package in *.deb; do dpkg-deb --field "$package" Depends; done) =~ $foreign ]]; then
    fail "A package depends on libraries for compilers of another machine"
fi
if [[ "$(field morvik Depends)" == *mpi* ]]; then
    fail "The command drags MPI along"
fi

for package in *.deb; do
    dpkg-deb --extract "$package" root
done
# Of files that are no programs, readelf complains.
paths=$(find root/usr/bin root/usr/lib -type f -exec readelf -d {} + 2>/dev/null | grep -E 'RPATH|RUNPATH' || true)
[ -z "$paths" ] || fail "Programs have search paths of their own: $paths"
if grep -rlF -e "$build" -e "$source" root; then
    fail "These files know where they were built"
fi
export LD_LIBRARY_PATH=$folder/root/usr/lib/$multiarch
share=$folder/root/usr/share

echo "The command"
vectors=$source/tests/data/vectors
$EMULATOR root/usr/bin/morvik decode "$vectors/k40.csv" --num-pu 8 --iterations 6 --reference "$vectors/k40.bits" --output bits
cmp bits "$vectors/k40.bits"
for file in man/man1/morvik.1.gz man/man1/morvik-ber.1.gz bash-completion/completions/morvik zsh/vendor-completions/_morvik; do
    [ -s "$share/$file" ] || fail "There is no share/$file"
done

echo "The sources for simulators"
for file in systemverilog/{morvik_pkg.sv,decoder_env_pkg.sv,morvik_dpi.h} vhdl/morvik_{,checker_,units_}pkg.vhd \
    systemc/Morvik{Decoder,Checker,Units}.h; do
    [ -s "$share/morvik/$file" ] || fail "There is no share/morvik/$file"
done

echo "The examples, by pkg-config"
mkdir programs
PKG_CONFIG_LIBDIR=$LD_LIBRARY_PATH/pkgconfig OUT=$folder/programs make -s -C "$share/doc/$development/examples" check

if [ "$architecture" = amd64 ]; then
    depends morvik-mpi libopenmpi3
    depends python3-morvik python3-numpy
    depends gr-morvik gnuradio
    depends gr-morvik python3-morvik
    depends octave-morvik octave-abi-57
    depends octave-morvik "$checker"
    echo "Python"
    PYTHONPATH=$folder/root/usr/lib/python3/dist-packages /usr/bin/python3 -c "
import morvik, numpy
streams = morvik.encode(numpy.ones((1, 40), dtype=numpy.uint8))
print(morvik.__file__)
assert morvik.__version__ == '${version%-1}'
" | grep -F "$folder/root"
    echo "GNU Radio"
    # The editor's compiler finds the descriptions, and the flowgraph the blocks.
    flowgraph=$share/doc/gr-morvik/examples/gnuradio_chain.grc
    HOME=$folder GRC_BLOCKS_PATH=$share/gnuradio/grc/blocks grcc --output "$folder" "$flowgraph" >grcc.log 2>&1 ||
        { cat grcc.log; fail "The flowgraph is refused"; }
    HOME=$folder PYTHONPATH=$folder/root/usr/lib/python3/dist-packages /usr/bin/python3 gnuradio_chain.py |
        grep ' of 200 transport blocks fit'
    echo "Octave"
    functions=$(dirname "$(find root/usr/lib -name morvik_decode.m)")
    octave-cli --no-history --norc --path "$functions" --eval "
        bits = rand(40, 3) < 0.5;
        [a, b, c] = morvik_encode(bits);
        assert(isequal(morvik_decode(16 * (2 * a - 1), 16 * (2 * b - 1), 16 * (2 * c - 1)), bits));
        assert(~any(morvik_lte_crc([bits; morvik_lte_crc(bits)])(:)));
        assert(morvik_unit_intrinsic(10, -24), int16(-19));
        printf('%s\n', which('morvik_decode'))" | grep -F "$functions"
fi
