#!/usr/bin/env bash
# The gain of scaling and of the correction table: the Eb/N0 at which each algorithm reaches a BLER of 0.1, for some
# block sizes, from one sweep. When run again, it reuses existing results.
#
#   MORVIK=build/x86_64/bin/morvik examples/sweep.sh [RESULTS.csv]
set -euo pipefail
results=${1:-sweep.csv}
"${MORVIK:-morvik}" ber --block-size 40,128,512 --algorithm max-log,scaled,table --ebn0 0:0.5:4 --stop-bler 0.1 \
    --iterations 6 --max-blocks 5000 --output "$results" --resume --quiet

# The last two points of each curve enclose the rate; between them its logarithm is nearly linear.
awk -F, -v rate=0.1 '
    NR == 1 { for (i = 1; i <= NF; ++i) column[$i] = i; next }
    {
        curve = sprintf("%4d bits, %-8s", $column["block_size"], $column["algorithm"])
        bler = $column["bler"]
        ebn0 = $column["ebn0_db"]
        if (bler < rate) {
            part = (log(before[curve]) - log(rate)) / (log(before[curve]) - log(bler))
            printf "%s %.1f dB\n", curve, at[curve] + part * (ebn0 - at[curve])
        }
        before[curve] = bler
        at[curve] = ebn0
    }' "$results"
