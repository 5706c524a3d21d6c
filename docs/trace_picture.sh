#!/usr/bin/env bash
# Makes trace.png, beside this file: GTKWave with the waveforms of docs/trace.md. Needs Debian's gtkwave, xvfb, xauth and
# imagemagick, and the command built.
set -euo pipefail
docs=$(cd "$(dirname "$0")" && pwd)
folder=$(mktemp -d)
trap 'rm -r "$folder"' EXIT
"$docs/../build/x86_64/bin/morvik" trace "$docs/../tests/data/vectors/k1024.csv" --half-iterations 0:1 \
    --format vcd --output "$folder/k1024.vcd"
cd "$folder"
export docs HOME=$folder
xvfb-run --auto-servernum --server-args='-screen 0 1100x640x24' bash -c '
    gtkwave --dump=k1024.vcd --save="$docs/trace.gtkw" --rcvar "splash_disable on" >log 2>&1 &
    sleep 5
    import -window root +dither -colors 32 -strip "png8:$docs/trace.png"
    kill %1'
