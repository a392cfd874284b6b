#!/usr/bin/env bash
# Builds a small host against an installed package and compares what it writes with expected.txt beside its source.
#
#     host.sh cmake|pkg-config PREFIX HOST_FOLDER WORK_FOLDER [FLAG...]
#
# The flags go to the compiler; CC, CXX and CMAKE name the tools.
set -euo pipefail
how=$1 prefix=$2 host=$3 work=$4
shift 4
flags=("$@")
rm -rf "$work"
mkdir -p "$work"

pkg_config_dir=$(dirname "$(find "$prefix" -name zrparsersql.pc -print -quit)")
library_dir=$(dirname "$(find "$prefix" -name libzrparsersql.so.0 -print -quit)")

case $how in
cmake)
    "$CMAKE" -S "$host" -B "$work/build" -DCMAKE_PREFIX_PATH="$prefix" -DCMAKE_BUILD_TYPE=Release \
        -DCMAKE_C_COMPILER="$CC" -DCMAKE_CXX_COMPILER="$CXX" \
        -DCMAKE_C_FLAGS="${flags[*]}" -DCMAKE_CXX_FLAGS="${flags[*]}" >"$work/log" 2>&1 &&
        "$CMAKE" --build "$work/build" >>"$work/log" 2>&1 || { cat "$work/log" >&2; exit 1; }
    program=$work/build/host
    ;;
pkg-config)
    export PKG_CONFIG_PATH=$pkg_config_dir
    if [[ -f $host/host.c ]]; then
        compiler=("$CC" -std=c11) source=$host/host.c
    else
        compiler=("$CXX" -std=c++20) source=$host/host.cpp
    fi
    # shellcheck disable=SC2046 # the words are meant to be split
    "${compiler[@]}" "${flags[@]}" "$source" -o "$work/host" $(pkg-config --cflags --libs zrparsersql)
    program=$work/host
    ;;
esac

LD_LIBRARY_PATH=$library_dir "$program" >"$work/output.txt"
diff -u "$host/expected.txt" "$work/output.txt"
