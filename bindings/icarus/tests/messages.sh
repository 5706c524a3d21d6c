#!/usr/bin/env bash
# Compares what a test bench writes with NAME.txt beside it; folders are left out. Its simulation ends with STATUS.
#   messages.sh MODULE BENCH.v STATUS
set -euo pipefail
got=$("$(dirname "$0")/simulate.sh" "$1" "$2") && status=0 || status=$?
diff "${2%.v}.txt" <(sed 's|: [^:]*/|: |' <<<"$got")
[ "$status" = "$3" ]
