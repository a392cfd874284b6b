#!/usr/bin/env bash
# Compiles with each compiler every header by itself; builds, by CMake and by pkg-config, the programs that the
# development package brings along, and compares what they write; does what the README tells; asks the program and its
# man page.
#
#     try_installed.sh PREFIX FOLDER
#
# FOLDER has the README, headers.sh and readme.sh, and is where everything is made.
set -euo pipefail
prefix=$1 folder=$2
examples=$prefix/share/doc/libzrparsersql-dev/examples/embed
export CMAKE_PREFIX_PATH=$prefix PKG_CONFIG_PATH LD_LIBRARY_PATH
PKG_CONFIG_PATH=$(dirname "$(find "$prefix" -name zrparsersql.pc -print -quit)")
LD_LIBRARY_PATH=$(dirname "$(find "$prefix" -name libzrparsersql.so.0 -print -quit)")
export PATH=$prefix/bin:$PATH

fail() {
    echo "$*" >&2
    exit 1
}
# quietly LOG COMMAND...
quietly() {
    local log=$1
    shift
    "$@" >"$log" 2>&1 || { cat "$log" >&2; fail "failed: $*"; }
}

# The compilers that are here; g++ has to be.
g++ --version | head -n 1
pairs=("gcc g++")
if command -v clang++ >/dev/null; then
    clang++ --version | head -n 1
    pairs+=("clang clang++")
else
    echo "clang++ isn't here: not tried"
fi

flags=(-Wall -Wextra -Wpedantic -Werror)
for pair in "${pairs[@]}"; do
    read -r CC CXX <<<"$pair"
    export CC CXX
    work=$folder/$CXX
    rm -rf "$work"
    mkdir -p "$work"

    echo "$CXX: $(bash "$folder/headers.sh" c++20 "$CXX" "$prefix/include") compile by themselves as C++20"
    echo "$CC: $(bash "$folder/headers.sh" c11 "$CC" "$prefix/include") compile by themselves as C11"

    quietly "$work/configure.log" cmake -S "$examples" -B "$work/cmake" -DCMAKE_CXX_FLAGS="${flags[*]}" -DCMAKE_C_FLAGS="${flags[*]}"
    quietly "$work/build.log" cmake --build "$work/cmake" --parallel 2
    quietly "$work/test.log" ctest --test-dir "$work/cmake" --output-on-failure --no-tests=error
    echo "$CXX: $(grep -c 'Passed' "$work/test.log") programs by CMake"

    count=0
    read -r -a library <<<"$(pkg-config --cflags --libs zrparsersql)"
    for expected in "$examples"/expected/*.txt; do
        name=$(basename "$expected" .txt)
        if [[ -f $examples/$name.c ]]; then
            "$CC" -std=c11 "${flags[@]}" "$examples/$name.c" -o "$work/$name" "${library[@]}"
        else
            "$CXX" -std=c++20 "${flags[@]}" "$examples/$name.cpp" -o "$work/$name" "${library[@]}"
        fi
        "$work/$name" | diff -u "$expected" -
        count=$((count + 1))
    done
    ((count > 0)) || fail "the package brings no examples"
    echo "$CXX: $count programs by pkg-config"

    CMAKE=$(command -v cmake) CC=$(command -v "$CC") CXX=$(command -v "$CXX") \
        quietly "$work/readme.log" bash "$folder/readme.sh" "$folder/README.md" "$examples" "$prefix" "$work/readme"
    echo "$CXX: the README's commands"
done

# The first query of the README, with the installed program.
awk '/^```/ { taking = 0 } taking; $0 == "```console" && !seen++ { taking = 1 }' "$folder/README.md" >"$folder/first"
command=$(sed -n '/^\$ /,/[^\\]$/p' "$folder/first" | sed 's/^\$ //; s|build/release/bin/||')
eval "$command" | diff -u <(sed '1,/[^\\]$/d' "$folder/first") -
echo "zrsql: the README's first query"

page=$(find "$prefix/share/man" -name 'zrsql.1*')
if command -v man >/dev/null; then
    complaints=$(MANWIDTH=80 man --warnings -l "$page" 2>&1 >"$folder/page.txt")
    [[ -z $complaints ]] || fail "the man page: $complaints"
    grep -q '^EXIT STATUS' "$folder/page.txt" || fail "the man page has no exit status"
    echo "zrsql: $(wc -l <"$folder/page.txt") lines of man page"
fi
bash -n "$prefix/share/bash-completion/completions/zrsql"
