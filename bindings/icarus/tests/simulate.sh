#!/usr/bin/env bash
# Compiles a test bench NAME.v with the VPI module and runs it; the status is that of the simulation.
#   simulate.sh MODULE BENCH.v [ARGS...]
set -euo pipefail
module=$1
bench=$2
shift 2
folder=$(mktemp -d)
trap 'rm -rf "$folder"' EXIT
iverilog -Wall -m "$module" -s "$(basename "$bench" .v)" -o "$folder/bench" "$bench"
vvp -n "$folder/bench" "$@"
