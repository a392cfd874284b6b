#!/usr/bin/env bash
# How the instructions of each shape of bench/queries.h grow when the text doubles, counted by callgrind: for the
# facade's road and for the whole analysis, SQL Server. What a first text of a process takes by itself is taken
# off. bench/README.md keeps the figures.
#
#     bench/growth.sh [BUILD_FOLDER [SHAPE...]]
set -euo pipefail

root=$(cd "$(dirname "$0")/.." && pwd)
program=${1:-$root/build/bench}/bin/bench/stages_bench
shift || true

profile=$(mktemp)
trap 'rm -f "$profile"' EXIT

count() { # SHAPE STAGE N
    valgrind --tool=callgrind --callgrind-out-file="$profile" --toggle-collect='measuredRun*' \
        "$program" --once "$1" "$2" "$3" 2>&1 | sed -n 's/.*Collected : //p'
}

printf '| shape | n | parse, millions at n and 2n | ratio | analyse | ratio |\n|---|---|---|---|---|---|\n'
while read -r shape n; do
    [[ $# -eq 0 || " $* " == *" $shape "* ]] || continue
    printf '| %s | %d |' "$shape" "$n"
    for stage in parse analyse; do
        first=$(count "$shape" "$stage" 1)
        one=$(($(count "$shape" "$stage" "$n") - first))
        two=$(($(count "$shape" "$stage" $((2 * n))) - first))
        awk -v one="$one" -v two="$two" 'BEGIN { printf " %.1f, %.1f | %.2f |", one / 1e6, two / 1e6, two / one }'
    done
    printf '\n'
done < <("$program" --shapes)
