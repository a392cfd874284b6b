#!/usr/bin/env bash
# Instructions a token by dialect and stage over the plain queries, counted by callgrind: the same on every
# machine with the same compiler, whatever else it does. bench/README.md keeps the figures.
#
#     bench/instructions.sh [BUILD_FOLDER]
set -euo pipefail

root=$(cd "$(dirname "$0")/.." && pwd)
program=${1:-$root/build/bench}/bin/bench/corpus_bench
stages=(lex recognise tree facade walk analyse)

profile=$(mktemp)
trap 'rm -f "$profile"' EXIT

printf '| dialect |'
printf ' %s |' "${stages[@]}"
printf '\n|---|'
printf -- '---|%.0s' "${stages[@]}"
printf '\n'
for dialect in mssql mysql oracle postgresql msaccess; do
    printf '| %s |' "$dialect"
    for stage in "${stages[@]}"; do
        output=$(valgrind --tool=callgrind --callgrind-out-file="$profile" --toggle-collect='measuredRun*' \
            "$program" --once --dialect "$dialect" --stage "$stage" 2>&1)
        tokens=$(sed -n 's/.*: \([0-9]*\) tokens/\1/p' <<<"$output")
        count=$(sed -n 's/.*Collected : //p' <<<"$output")
        printf ' %d |' $((count / tokens))
    done
    printf '\n'
done
