#!/usr/bin/env bash
# The pictures in docs/ are those that docs/pictures.py draws from the model as it is.
set -euo pipefail
docs=$(cd "$(dirname "$0")/../../docs" && pwd)
drawn=$(mktemp -d)
trap 'rm -r "$drawn"' EXIT
python3 "$docs/pictures.py" "$drawn"
for picture in "$drawn"/*.svg; do
    cmp "$picture" "$docs/$(basename "$picture")"
done
