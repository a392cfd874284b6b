#!/usr/bin/env bash
# Compares the names that the shared library shows with the list of them.
#
#     exported_symbols.sh NM LIBRARY LIST
set -euo pipefail
nm=$1 library=$2 list=$3

shown() {
    "$nm" -D -C --defined-only "$library" | sed -E 's/^[0-9a-f]+ [A-Za-z] //; s/@@?.*//' | LC_ALL=C sort -u
}
told() {
    grep -vE '^(#|$)' "$list" | LC_ALL=C sort
}
diff -u --label "$list" --label "$library" <(told) <(shown)
