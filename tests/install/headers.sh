#!/usr/bin/env bash
# Compiles every public header by itself, and all of them together, with warnings as errors.
#
#     headers.sh c++20|c11 COMPILER INCLUDE_FOLDER...
#
# In C11 these are the headers that serve C: those whose declarations stand in an extern "C" block, and what belongs
# to them.
set -euo pipefail
standard=$1 compiler=$2
shift 2
language=c
[[ $standard == c++* ]] && language=c++

headers=()
flags=()
for folder; do
    flags+=(-I "$folder")
    while IFS= read -r header; do
        if [[ $language == c++ ]] || grep -qE 'extern "C"|^#ifndef ZRPARSERSQL_RECOGNIZERS' "$folder/$header"; then
            headers+=("$header")
        fi
    done < <(cd "$folder" && find zrparsersql -name '*.h' | sort)
done
((${#headers[@]} >= 10)) || { echo "only ${#headers[@]} headers in $*" >&2; exit 1; }

# compile HEADER...: one file that includes them twice, as hosts come to do.
compile() {
    printf '#include <%s>\n' "$@" "$@" |
        "$compiler" -x "$language" -std="$standard" -Wall -Wextra -Wpedantic -Wshadow -Werror -fsyntax-only "${flags[@]}" - ||
        { echo "with $compiler as $standard: $*" >&2; return 1; }
}

failed=0 running=0
for header in "${headers[@]}"; do
    compile "$header" &
    if ((++running == 2)); then
        wait -n || failed=1
        running=1
    fi
done
wait -n || failed=1
compile "${headers[@]}" || failed=1
echo "${#headers[@]} headers"
exit $failed
