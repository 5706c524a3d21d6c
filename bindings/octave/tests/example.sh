#!/usr/bin/env bash
# The example prints falling error rates and draws a curve for each algorithm.
#   example.sh FUNCTIONS FILE.svg
set -euo pipefail
rm -f "$2"
rates=$("$(dirname "$0")/../example/draw" "$1" "$2")
echo "$rates"
# Eb/N0, "dB", and the rates of max-log, scaled and table.
awk 'NR == 1 && !($3 > 0.1) { exit 1 }
    $1 > 0 && $1 < 1.1 && !($3 > $4 && $4 > $5) { exit 1 }
    $1 == 1.5 && !($3 < 0.001) { exit 1 }
    END { if (NR != 7) exit 1 }' <<<"$rates" || { echo "These are not the rates of the decoder" >&2; exit 1; }
for text in max-log scaled table 'bit error rate'; do
    grep -qF ">$text<" "$2" || { echo "$2 does not show '$text'" >&2; exit 1; }
done
