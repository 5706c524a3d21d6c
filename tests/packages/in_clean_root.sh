#!/bin/sh
# What clean_root.sh does in the new system: installs the packages in this folder, uses them and removes them.
set -eu
cd "$(dirname "$0")"
export DEBIAN_FRONTEND=noninteractive LC_ALL=C.UTF-8
fail() {
    echo "$*" >&2
    exit 1
}

echo "== install"
# The library and what is compiled with it, of both word sizes beside each other; of the rest, that of this machine.
chmod a+rX . ./*
apt-get install -q -y --no-install-recommends ./*_amd64.deb ./*_all.deb ./libmorvik*_i386.deb ./morvik-simulators_*_i386.deb \
    openmpi-bin >log 2>&1 || { cat log; fail "They cannot be installed"; }
installed=$(dpkg-query --show --showformat '${Package}:${Architecture}\n' '*morvik*' | sort)
echo "$installed"
mkdir -m 777 scratch

# As anybody, in a folder of their own.
as_nobody() {
    setpriv --reuid=65534 --regid=65534 --clear-groups env HOME="$PWD/scratch" "$@"
}

echo "== command"
as_nobody morvik decode k40.csv --num-pu 8 --iterations 6 --reference k40.bits
as_nobody morvik selftest | tail -n 1
as_nobody mpirun --mca plm isolated -n 1 morvik-mpi ber --block-size 40 --ebn0 1 --max-blocks 100 --output scratch/k40.csv >/dev/null
grep -c , scratch/k40.csv

echo "== examples by pkg-config, of both word sizes"
examples=/usr/share/doc/libmorvik-v1-0-bitacc-cmodel-dev/examples
for bits in 64 32; do
    mkdir -m 777 "scratch/$bits"
    case $bits in
        64) libraries=/usr/lib/x86_64-linux-gnu ;;
        32) libraries=/usr/lib/i386-linux-gnu ;;
    esac
    as_nobody PKG_CONFIG_LIBDIR=$libraries/pkgconfig CFLAGS=-m$bits CXXFLAGS=-m$bits OUT="$PWD/scratch/$bits" make -s -C "$examples" check
done

echo "== examples by CMake"
as_nobody cmake -S "$examples" -B scratch/cmake >/dev/null
as_nobody cmake --build scratch/cmake >/dev/null
as_nobody ctest --test-dir scratch/cmake | tail -n 3

echo "== Python"
as_nobody python3 -c "
import morvik, numpy
rng = numpy.random.default_rng(1)
sent = rng.integers(0, 2, (3, 512))
decided = morvik.Decoder(num_pu=8).decode(*morvik.awgn(morvik.encode(sent), ebn0_db=3, rng=rng))
assert (decided.bits == sent).all()
print(morvik.__version__)
"

echo "== GNU Radio"
as_nobody grcc --output scratch /usr/share/doc/gr-morvik/examples/gnuradio_chain.grc >/dev/null
as_nobody python3 scratch/gnuradio_chain.py

echo "== Octave"
as_nobody octave-cli --no-history --norc --eval "
bits = rand(512, 3) < 0.5;
[a, b, c] = morvik_encode(bits);
assert(isequal(morvik_decode(16 * (2 * a - 1), 16 * (2 * b - 1), 16 * (2 * c - 1)), bits));
disp(which('morvik_decode'))"

echo "== Icarus Verilog"
printf 'module test; initial $display("%%0d", $morvik_create(8, 1, 8)); endmodule\n' >scratch/test.v
as_nobody iverilog -o scratch/test.vvp scratch/test.v
as_nobody vvp -m morvik scratch/test.vvp

echo "== remove"
# shellcheck disable=SC2086
apt-get purge -q -y $installed >log 2>&1 || { cat log; fail "They cannot be removed"; }
left=$(find /usr /etc /var/lib/dpkg /opt /srv -iname '*morvik*')
[ -z "$left" ] || fail "The packages leave behind: $left"
! ldconfig -p | grep morvik || fail "The linker remembers the libraries"
echo "nothing is left"
