#!/usr/bin/env bash
# Makes the Debian packages, looks into them, unpacks them into an empty folder, and builds and runs a small host and the
# program from there.
#
#     packages.sh BUILD_FOLDER TESTS_FOLDER WORK_FOLDER
#
# CPACK, CMAKE, CC and CXX name the tools.
set -euo pipefail
build=$1 tests=$2 work=$3
root=$tests/../..
rm -rf "$work"
mkdir -p "$work"
fail() {
    echo "$*" >&2
    exit 1
}

"$CPACK" --config "$build/CPackConfig.cmake" -B "$work/packages" >"$work/log" 2>&1 || { cat "$work/log" >&2; exit 1; }
names=()
for package in "$work"/packages/*.deb; do
    names+=("$(dpkg-deb --field "$package" Package)")
    dpkg-deb --extract "$package" "$work/root"
    [[ $(dpkg-deb --field "$package" Version) == "$(dpkg-deb --field "$work"/packages/zrsql_*.deb Version)" ]] ||
        fail "the versions of the packages differ"
done
[[ ${names[*]} == "libzrparsersql-dev libzrparsersql zrsql" ]] || fail "packages: ${names[*]}"

# has PACKAGE FIELD WORD...: the field of the package's record has each of the words.
has() {
    local value
    value=$(dpkg-deb --field "$work/packages/$1"_*.deb "$2")
    local field=$2
    shift 2
    for word; do [[ $value == *"$word"* ]] || fail "$field lacks $word: $value"; done
}
version=$(dpkg-deb --field "$work"/packages/zrsql_*.deb Version)
has libzrparsersql Depends libantlr3c libicu libuuid1 libstdc++6
has libzrparsersql-dev Depends "libzrparsersql (= $version)" libantlr3c-dev libicu-dev uuid-dev
has zrsql Depends "libzrparsersql (= $version)" libsqlite3-0
has zrsql Suggests mdbtools
dpkg-deb --info "$work"/packages/libzrparsersql_*.deb shlibs | grep -q "^libzrparsersql 0 libzrparsersql (>= ${version%.*}), libzrparsersql (<< " || fail "no shlibs"
dpkg-deb --info "$work"/packages/libzrparsersql_*.deb triggers | grep -q ldconfig || fail "no ldconfig trigger"
for name in "${names[@]}"; do
    [[ -s $work/root/usr/share/doc/$name/copyright ]] || fail "$name has no copyright file"
done

guides=$work/root/usr/share/doc/libzrparsersql-dev
for file in README.md docs/embedding.md examples/embed/CMakeLists.txt examples/embed/expected/columns.txt; do
    cmp "$root/$file" "$guides/$file" || fail "the development package has not the tree's $file"
done

bash "$tests/host.sh" cmake "$work/root/usr" "$tests/host" "$work/cmake"
bash "$tests/host.sh" pkg-config "$work/root/usr" "$tests/host_in_c" "$work/pkg-config"

library_dir=$(dirname "$(find "$work/root" -name libzrparsersql.so.0 -print -quit)")
tree=$(LD_LIBRARY_PATH=$library_dir "$work/root/usr/bin/zrsql" tree -d mssqlfrom "a JOIN b")
[[ $tree == '(5 "FROM_DEF_" '* ]] || fail "zrsql: $tree"
readers=$(LD_LIBRARY_PATH=$library_dir "$work/root/usr/bin/zrsql" --version)
[[ $readers != *PostgreSQL* ]] || has zrsql Depends libpq5
[[ $readers != *MariaDB* ]] || has zrsql Depends libmariadb3
