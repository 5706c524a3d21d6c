#!/bin/sh
# Runs a command and compares its standard output with the expected text.
#   check.sh EXPECTED COMMAND...
set -eu
expected=$1
shift
printed=$("$@")
if [ "$printed" != "$(cat "$expected")" ]; then
    printf '%s printed\n%s\nand not\n%s\n' "$*" "$printed" "$(cat "$expected")" >&2
    exit 1
fi
echo "$(basename "$expected" .expected): as expected"
