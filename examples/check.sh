#!/bin/sh
# Runs a program and compares what it prints on its standard output with the expected text.
#   check.sh PROGRAM EXPECTED
set -eu
printed=$("$1")
if [ "$printed" != "$(cat "$2")" ]; then
    printf '%s printed\n%s\nand not\n%s\n' "$1" "$printed" "$(cat "$2")" >&2
    exit 1
fi
echo "$(basename "$1"): as expected"
