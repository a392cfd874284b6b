#!/usr/bin/env bash
# Does in an empty folder what the README tells somebody who embeds the installed library: its two files, then each of
# its blocks of commands, which have to write what it says, or for the example in C what the example is expected to.
#
#     readme.sh README EXAMPLES PREFIX WORK_FOLDER
#
# EXAMPLES is the folder of the embedding programs. CMAKE, CC and CXX name the tools.
set -euo pipefail
readme=$1 examples=$2 prefix=$3 work=$4
rm -rf "$work"
mkdir -p "$work/bin"
cd "$work"

# block LANGUAGE N: the Nth block of the README's part about embedding in that language.
block() {
    awk -v fence="\`\`\`$1" -v wanted="$2" '
        /^## / { inside = $0 == "## Embed it" }
        !inside { next }
        $0 == fence { taking = ++count == wanted; next }
        /^```/ { taking = 0 }
        taking' "$readme"
}
block cmake 1 >CMakeLists.txt
block cpp 1 >host.cpp
block console 1 | tail -n +2 >expected.txt
for file in CMakeLists.txt host.cpp expected.txt; do
    [[ -s $file ]] || { echo "the README shows no $file" >&2; exit 1; }
done
cp "$examples/recognisers.c" .

# The commands name the tools plainly: those of this build answer.
ln -s "$CMAKE" bin/cmake
ln -s "$CC" bin/gcc
ln -s "$CXX" bin/g++
export PATH=$work/bin:$PATH CMAKE_PREFIX_PATH=$prefix LD_LIBRARY_PATH
LD_LIBRARY_PATH=$(dirname "$(find "$prefix" -name libzrparsersql.so.0 -print -quit)")
PKG_CONFIG_PATH=$(dirname "$(find "$prefix" -name zrparsersql.pc -print -quit)")
export PKG_CONFIG_PATH

# run N EXPECTED: the Nth block of commands, whose last lines are what the file holds.
run() {
    block sh "$1" >commands.sh
    [[ -s commands.sh ]] || { echo "the README shows no block of commands $1" >&2; exit 1; }
    bash -e commands.sh >output.txt
    tail -n "$(wc -l <"$2")" output.txt | diff -u "$2" -
}
run 1 expected.txt
run 2 expected.txt
run 3 "$examples/expected/recognisers.txt"
