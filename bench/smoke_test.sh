#!/usr/bin/env bash
# Runs the short lines of the benchmarks for a moment: they must succeed, which includes that the decoders
# decided rightly, and print whole tables.
#   smoke_test.sh MORVIK_BENCH MORVIK_BENCH_FRAMES MORVIK_BENCH_BROKEN MORVIK_BENCH_FRAMES_BROKEN
set -euo pipefail
json=$(mktemp)
trap 'rm -f "$json"' EXIT
output=$("$1" --filter 'K=40/|K=(drawn|sorted)/|compare/K=512/' --repetitions 2 --seconds 0.001 --json "$json")
fail() {
    echo "smoke_test.sh: $1 in:" >&2
    echo "$output" >&2
    exit 1
}
# expect COUNT WHAT REGEX: COUNT lines match REGEX.
expect() {
    [ "$(grep -cE "$3" <<<"$output")" = "$1" ] || fail "not $1 $2"
}
number='[0-9]+(\.[0-9]+)?(e-[0-9]+)?'
positive=' +[0-9]*[1-9][0-9]*\.[0-9]+| +[0-9]+\.[0-9]*[1-9][0-9]*'
expect 1 'table of lines' '^\| +K \| units \| type \| call +\| instruction set \| +Mbit/s \|.*\| ratio to probe \|$'
expect 2 'lines of 40 bits' "^\\| +40 \\| +4 \\| +1 \\| [a-z0-9 ]+ \\| [a-z0-9]+ +(\\|($positive) ){4}\\|\$"
for order in sorted drawn; do
    expect 1 "line of sizes, $order" "^\\| +$order \\| +4 \\| +1 \\| single +\\| [a-z0-9]+ +(\\|($positive) ){3}\\| +- \\|\$"
done
expect 1 'table of decoders' '^\| decoder +\| +K \|.*\| bit error rate \|$'
expect 2 'lines of morvik among the decoders' \
    "^\\| morvik, 4 units, type 0 \\| +512 \\| [a-z0-9 ]+ (\\|($positive) ){3}\\| +$number \\|\$"
expect 1 'line on IT++' "^\\| IT\\+\\+ LOGMAX +\\| +512 \\| single +(\\|($positive) ){3}\\| +$number \\|\$|^IT\\+\\+ was left out"
expect 1 'table of the probe' '^\| instruction set \| lanes \| cycles/step/16 lanes \|$'
expect 1 'probe of what every machine has' "^\\| generic +\\| +8 \\|($positive) \\|\$"

if "$1" --filter 'no such line' >/dev/null 2>&1; then
    fail 'a filter that matches nothing is accepted'
fi

python3 - "$json" <<'PYTHON' || fail 'the JSON is not that'
import json, sys
lines = json.load(open(sys.argv[1]))["benchmarks"]
assert len(lines) >= 12 and all(line["Mbit/s"] > 0 for line in lines), lines
assert [line["repetition"] for line in lines] == [0, 1] * (len(lines) // 2), lines
PYTHON

# What decodes wrongly is not measured.
for filter in '^K=40/batch' 'compare/K=512/batch'; do
    if output=$("$3" --filter "$filter" --repetitions 1 --seconds 0 2>&1); then
        fail 'a wrong bit is not noticed'
    fi
    expect 1 'message on a wrong bit' '^morvik_bench: .*/batch/.*: decodes to other bits than the components$'
done
if output=$("$4" --repetitions 1 --seconds 0 2>&1); then
    fail 'a wrong bit of frames is not noticed'
fi
expect 1 'message on a wrong bit' '^morvik_bench_frames: K=6144/.*: decodes to other bits than the components$'

output=$("$2" --repetitions 1 --seconds 0)
expect 1 'table of frames' '^\| +K \| frames a call \| instructions \|.*\| make / decode \|$'
for set in $(sed -n -E 's/^\| +[0-9]+ \| +[0-9]+ \| ([a-z0-9]+) .*/\1/p' <<<"$output" | sort -u) generic; do
    expect 6 "lines of frames with $set" "^\\| +[0-9]+ \\| +[0-9]+ \\| $set +(\\|($positive) ){4}\\|($positive) % \\|\$"
done
