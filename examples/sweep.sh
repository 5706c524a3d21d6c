#!/usr/bin/env bash
# What scaling and the correction table are worth: the Eb/N0 at which each algorithm comes down to one wrong block in
# ten, for some block sizes, from one sweep. Run again, it takes up the results that are there.
#
#   MORVIK=build/x86_64/bin/morvik examples/sweep.sh [RESULTS.csv]
set -euo pipefail
results=${1:-sweep.csv}
"${MORVIK:-morvik}" ber --block-size 40,128,512 --algorithm max-log,scaled,table --ebn0 0:0.5:4 --stop-bler 0.1 \
    --iterations 6 --max-blocks 5000 --output "$results" --resume --quiet

# The last two points of each curve stand around the rate; between them its logarithm is nearly a line.
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
